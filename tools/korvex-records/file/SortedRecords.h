#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "file/StrictReader.h"

// Where the records of a file are, in key order. It holds their keys, not their values.
class SortedRecords {
  public:
    struct Record {
        std::size_t key = 0;  // where it begins among the keys
        std::uint32_t keySize = 0;
        std::uint32_t valueSize = 0;
        std::uint64_t valueAt = 0;  // in the file
    };

    // Reads all that the reader has, and keeps those whose keys begin with the prefix.
    explicit SortedRecords(StrictReader& reader, const std::string& prefix = "");

    const std::vector<Record>& records() const { return _records; }
    std::string_view keyOf(const Record& record) const;

  private:
    std::string _keys;
    std::vector<Record> _records;
};
