#pragma once

#include <korvex/util/Logger/LogLevel.h>

#include <string_view>

inline namespace korvex {

struct LevelWord {
    std::string_view word;  // of a literal, so NUL-terminated
    LogLevel level;
};

// The levels' names, in logged lines and in the configuration alike.
inline constexpr LevelWord kLevelWords[] = {
    {"DEBUG", DEBUG}, {"INFO", INFO},   {"NOTICE", NOTICE}, {"WARN", WARN},   {"ERROR", ERROR},
    {"CRIT", CRIT},   {"ALERT", ALERT}, {"FATAL", FATAL},   {"EMERG", EMERG},
};

}  // namespace korvex
