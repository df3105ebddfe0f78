#pragma once

#include <korvex/util/Logger.h>

inline namespace korvex {

// The logger of threads and locks.
Logger& threadLogger();

}  // namespace korvex
