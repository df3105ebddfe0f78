#pragma once

#include <korvex/util/Pathname.h>

#include <optional>
#include <string>
#include <vector>

// The command line, taken apart.
struct Options {
    // What is written to standard output. FINDINGS: nothing but those.
    enum Mode { REPORT, FINDINGS, JSON, FIX, CODES, EXPORT };

    Mode mode = REPORT;
    std::vector<std::string> files;  // "-" is standard input; there are none with CODES
    Pathname home;                   // empty: "${KORVEX_HOME}" stays as written
    std::optional<std::string> channel;
    bool paths = false;
    std::optional<std::string> user;      // who is to write the log files
    std::string engine;                   // with EXPORT; "list" takes no file
    std::optional<std::string> appender;  // the only one to be exported
};

// Throws Failure. --help and --version end the process.
Options parseOptions(int argc, const char* const* argv);
