#pragma once

#include <string>
#include <vector>

// The command line, taken apart.
struct Options {
    std::string file;   // -f; empty: the store's own place
    std::string input;  // -i; empty: none
    bool longList = false;
    bool nulSeparated = false;
    bool hex = false;
    bool print = false;
    bool create = false;
    bool force = false;
    std::vector<std::string> words;  // the verb and its arguments
};

// Throws Failure USAGE. --help and --version end the process with status 0.
Options parseOptions(int argc, const char* const* argv);
