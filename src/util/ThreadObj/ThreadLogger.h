#pragma once

#include <korvex/util/Logger.h>

inline namespace korvex {

// Where threads and locks report.
Logger& threadLogger();

}  // namespace korvex
