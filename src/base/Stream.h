#pragma once

#include <cstdio>
#include <memory>

inline namespace korvex {

struct CloseStream {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

// A standard I/O stream, closed on every way out. (One that was written to is released and closed
// by hand where all went well: its close can fail.)
using Stream = std::unique_ptr<std::FILE, CloseStream>;

}  // namespace korvex
