#include "base/PrintfBuffer.h"

#include <cstdio>

inline namespace korvex {

namespace {

int formatInto(char* buf, std::size_t size, const char* fmt, va_list ap) {
    va_list again;
    va_copy(again, ap);
    const int length = std::vsnprintf(buf, size, fmt, again);
    va_end(again);
    return length;
}

}  // namespace

// C99's vsnprintf returns the length that is needed, so one retry is usually enough. If another
// thread makes a text longer between the two calls, one more is needed. A negative result means
// that a conversion failed; a larger buffer does not help.
PrintfBuffer::PrintfBuffer(const char* fmt, va_list ap) {
    std::size_t size = sizeof _local;
    int length = formatInto(_local, size, fmt, ap);
    while (length >= 0 && static_cast<std::size_t>(length) >= size) {
        size = static_cast<std::size_t>(length) + 1;
        _heap.reset(new char[size]);
        length = formatInto(_heap.get(), size, fmt, ap);
    }
    _ok = length >= 0;
    _size = _ok ? static_cast<std::size_t>(length) : 0;
    if (!_ok) _heap.reset();
    if (!_ok) _local[0] = '\0';
}

}  // namespace korvex
