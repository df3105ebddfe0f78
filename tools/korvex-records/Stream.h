#pragma once

#include <cstdio>
#include <memory>

struct CloseStream {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

// A standard I/O stream for reading, closed on every way out. (One that was written to is closed by
// hand: its close can fail.)
using Stream = std::unique_ptr<std::FILE, CloseStream>;
