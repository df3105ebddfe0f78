#pragma once

#include <korvex/util/Pathname.h>

#include "base/Stream.h"

#include <cstddef>
#include <memory>

inline namespace korvex {

// A file that is being written from its beginning. Its stream has no buffer: exit(3) writes out
// what it finds in any stream's buffer, while another thread is filling it as well as in a child of
// fork(2), which has a copy of it. What is written is staged here, where exit does not look.
class StagedFile {
  public:
    // Opens the file; on failure false, and errno is fopen(3)'s.
    explicit StagedFile(const Pathname& file);
    explicit operator bool() const { return _file != nullptr; }

    // False when the file did not take all that it was given; errno tells why. It then holds a
    // beginning of what was written; what is still staged is dropped.
    bool write(const void* p, std::size_t n);
    // Hands on what is staged and closes the file. False as from write(), or when the closing
    // fails.
    bool close();

  private:
    bool handOn(const void* p, std::size_t n);
    bool flush();

    const std::unique_ptr<char[]> _staging;  // null where there was no memory: works without
    const std::size_t _size;                 // of _staging, in bytes
    std::size_t _used = 0;
    Stream _file;
};

}  // namespace korvex
