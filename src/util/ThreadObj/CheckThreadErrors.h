#pragma once

#include <atomic>

inline namespace korvex {

// Whether failed calls of the thread library throw. Relaxed accesses are enough: it guards no other
// data, and is written once, at the end of the process.
extern std::atomic<bool> checkThreadErrors;

}  // namespace korvex
