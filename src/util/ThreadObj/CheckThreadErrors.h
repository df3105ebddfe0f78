#pragma once

#include <atomic>

inline namespace korvex {

// Whether failed thread-library calls throw. Relaxed accesses do: it guards no other data, and is
// written once, at the end of the process.
extern std::atomic<bool> checkThreadErrors;

}  // namespace korvex
