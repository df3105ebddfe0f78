#pragma once

#include <string>

namespace schedules {

// Puts the value into the process's store.
void put(const std::string& key, const std::string& value, bool save);

// A record file with these records, in this order, behind the version record.
std::string recordFile(std::initializer_list<std::pair<std::string, std::string>> records);

// Whether the bytes are the beginning of the others, or all of them.
bool isBeginningOf(const std::string& bytes, const std::string& whole);

}  // namespace schedules
