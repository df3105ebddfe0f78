#pragma once

#include <cstdarg>
#include <cstddef>
#include <memory>

inline namespace korvex {

// The text of one printf-style formatting: on the stack up to 255 characters, on the heap beyond.
class PrintfBuffer {
  public:
    // Formats at once. A conversion that printf refuses (a wide character that has no multibyte
    // form) leaves ok() false and the text empty. Throws std::bad_alloc.
    PrintfBuffer(const char* fmt, va_list ap) __attribute__((format(printf, 2, 0)));

    bool ok() const { return _ok; }
    const char* data() const { return _heap ? _heap.get() : _local; }
    std::size_t size() const { return _size; }

  private:
    char _local[256];
    std::unique_ptr<char[]> _heap;
    std::size_t _size = 0;
    bool _ok = true;
};

}  // namespace korvex
