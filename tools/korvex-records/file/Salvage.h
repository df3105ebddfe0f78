#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

#include "file/OpenFile.h"

// A part of a damaged file that no record is taken from.
struct Gap {
    std::uint64_t offset = 0;
    std::uint64_t bytes = 0;
    std::string reason;
    unsigned gone = 0;     // so many records are surely gone
    bool isExact = false;  // and no others
};

struct Salvaging {
    std::function<void(const RecordFrame& frame, const std::string& key, std::string_view value)>
        take;
    std::function<void(const Gap& gap)> tell;
};

// Hands on each record that is surely whole, and each gap between them, in the file's order. Reads
// only. Throws Failure IO_ERROR.
void salvage(int fd, std::uint64_t size, const std::string& name, const Salvaging& to);
