#pragma once

#include <korvex/util/Pathname.h>

#include <optional>
#include <string>
#include <vector>

// The command line, taken apart.
struct Options {
    std::optional<Pathname> file;      // -f; none: the store's own place
    std::optional<std::string> input;  // -i
    std::optional<std::string> value;  // --value
    std::optional<Pathname> output;    // -o
    std::optional<unsigned> wait;      // --wait, in seconds
    bool longList = false;
    bool nulSeparated = false;
    bool hex = false;
    bool print = false;
    bool json = false;
    bool replace = false;
    bool keep = false;
    bool dryRun = false;
    bool keyEscaped = false;
    bool anyVersion = false;
    bool create = false;
    bool verbose = false;
    bool version = false;
    bool help = false;
    std::vector<std::string> given;  // the long names of those that were given
    std::vector<std::string> words;  // the verb and its arguments
};

// One option, as the help tells it.
struct OptionText {
    const char* name;      // the long one
    char letter;           // NUL: none
    const char* argument;  // null: it takes none
    const char* does;
};

// All of them, in the order of the help.
const std::vector<OptionText>& optionTexts();

// Throws Failure USAGE.
Options parseOptions(int argc, const char* const* argv);
