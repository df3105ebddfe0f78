#pragma once

#include <cstddef>

inline namespace korvex {

// Stores the system's description of an error number, NUL-terminated, in buf. False when the
// system knows no such number, and in a signal handler that interrupted its thread in here.
bool errorText(int errnum, char* buf, std::size_t size);

}  // namespace korvex
