#pragma once

#include <map>
#include <string>

// The record file once more, read out of one string.
namespace reference {

struct Loaded {
    std::map<std::string, std::string> records;
    bool unversioned = false;  // the end was a surprise, and there was no version
    bool huge = false;         // a length beyond what anyone tries to compare
};

Loaded loadRecords(const std::string& file);
std::string saveRecords(const std::map<std::string, std::string>& records);

}  // namespace reference
