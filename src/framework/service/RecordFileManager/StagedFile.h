#pragma once

#include <korvex/util/Pathname.h>

#include "base/Stream.h"

#include <cstddef>
#include <memory>

inline namespace korvex {

// A file that is written from its beginning. Its stream has no buffer, because exit(3) writes the
// buffers of all streams: also while another thread fills one, and in a child of fork(2), which has
// a copy. The bytes are staged in this object instead, which exit does not write.
class StagedFile {
  public:
    // Opens the file; on failure false, and errno is fopen(3)'s.
    explicit StagedFile(const Pathname& file);
    explicit operator bool() const { return _file != nullptr; }

    // False if not all bytes could be written; errno has the reason. The file then holds the first
    // part of them, and the staged bytes are dropped.
    bool write(const void* p, std::size_t n);
    // Writes the staged bytes and closes the file. False as for write(), or if the close fails.
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
