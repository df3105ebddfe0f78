#pragma once

#include <cstddef>

inline namespace korvex {

// Stores the system's description of an error number, NUL-terminated, in buf. False if the system
// has none, and in a signal handler that interrupted its thread in this function.
bool errorText(int errnum, char* buf, std::size_t size);

}  // namespace korvex
