#include "Output.h"

#include <unistd.h>

#include <cstdlib>
#include <cstring>

#include "support/StandardOutput.h"
#include "support/TerminalQuery.h"

namespace {

bool coloursWanted() {
    const char* const refused = std::getenv("NO_COLOR");
    if (refused != nullptr && *refused != '\0') return false;
    const char* const terminal = std::getenv("TERM");
    if (terminal == nullptr || std::strcmp(terminal, "dumb") == 0) return false;
    return isTerminal(STDOUT_FILENO);
}

const char* sequence(Ink ink) {
    switch (ink) {
        case Ink::PLAIN:
            break;
        case Ink::TITLE:
            return "\033[1m";
        case Ink::GOOD:
            return "\033[32m";
        case Ink::WARNING:
            return "\033[1;35m";
        case Ink::ERROR:
            return "\033[1;31m";
        case Ink::QUIET:
            return "\033[2m";
    }
    return "";
}

}  // namespace

void write(std::string_view text, Ink ink) {
    static const bool coloured = coloursWanted();
    if (!coloured || ink == Ink::PLAIN) return writeOutput(text);
    writeOutput(sequence(ink));
    writeOutput(text);
    writeOutput("\033[0m");
}
