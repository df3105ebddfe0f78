#pragma once

#include "framework/service/RecordFileManager/RecordBlock.h"

#include <cstddef>
#include <cstdio>

inline namespace korvex {

// What could be read of a file, in one block.
struct FileBytes {
    Block block;             // null when memory ran out
    std::size_t size = 0;    // in bytes
    bool metTheEnd = false;  // false: a read failed before

    const char* begin() const { return block.get(); }
    const char* end() const { return block.get() + size; }
};

// Reads a stream that was just opened, to its end. It need not be seekable. The stream has no
// buffer afterwards: with a buffer, the exit(3) of a child that was forked meanwhile would move the
// file offset back, for the parent too.
FileBytes readToEnd(std::FILE* file);

}  // namespace korvex
