#pragma once

#include <korvex/util/Logger/LogLevel.h>

#include <string>

inline namespace korvex {

// Writes "LEVEL - text" and a newline to descriptor 2 with one write(2). A failure is ignored.
// Throws std::bad_alloc.
void fallback_to_stderr(LogLevel level, const std::string& text);

}  // namespace korvex
