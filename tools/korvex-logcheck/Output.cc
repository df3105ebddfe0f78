#include "Output.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "Status.h"

namespace {

[[noreturn]] void lost() {
    throw Failure(std::string("standard output: ") + std::strerror(errno));
}

bool coloursWanted() {
    const char* const refused = std::getenv("NO_COLOR");
    if (refused != nullptr && *refused != '\0') return false;
    const char* const terminal = std::getenv("TERM");
    if (terminal == nullptr || std::strcmp(terminal, "dumb") == 0) return false;
    return isatty(STDOUT_FILENO) == 1;
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

void put(std::string_view bytes) {
    if (std::fwrite(bytes.data(), 1, bytes.size(), stdout) != bytes.size()) lost();
}

}  // namespace

void write(std::string_view text, Ink ink) {
    static const bool coloured = coloursWanted();
    if (!coloured || ink == Ink::PLAIN) return put(text);
    put(sequence(ink));
    put(text);
    put("\033[0m");
}

// Some file systems tell a full disk only when the file is closed.
void finishOutput() {
    if (std::fflush(stdout) != 0) lost();
    const int fd = dup(STDOUT_FILENO);
    if (fd < 0 || close(fd) != 0) lost();
}
