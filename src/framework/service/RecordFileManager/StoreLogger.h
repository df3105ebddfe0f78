#pragma once

#include <korvex/util/Logger.h>

inline namespace korvex {

// Where the record store reports: the logger "recordFileManager".
Logger& storeLogger();

}  // namespace korvex
