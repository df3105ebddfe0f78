#pragma once

#include <cstdarg>
#include <string>

inline namespace korvex {

// Sets an empty `out` to what printf(3) makes of a format that holds no other conversions than %d
// %i %u %ld %lu %s %c %x and %%, if that is at most 255 characters: most messages, at a third of
// printf's price (a fifth of what a line to a file costs). False, and `out` untouched, for any
// other; `ap` is not moved on. Throws std::bad_alloc.
bool formatPlain(std::string& out, const char* fmt, va_list ap)
    __attribute__((format(printf, 2, 0)));

}  // namespace korvex
