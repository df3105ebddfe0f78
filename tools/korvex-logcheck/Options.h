#pragma once

#include <korvex/util/Pathname.h>

#include <optional>
#include <string>

// The command line, taken apart.
struct Options {
    Pathname file;
    Pathname home;  // empty: "${KORVEX_HOME}" stays as written
    std::optional<std::string> channel;
    std::optional<std::string> engine;    // to export to
    std::optional<std::string> appender;  // the only one to be exported
};

// Throws Failure. --help and --version end the process.
Options parseOptions(int argc, const char* const* argv);
