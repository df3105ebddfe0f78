#include "Status.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "terminal/Progress.h"
#include "text/Escape.h"

std::string withErrno(const std::string& message) {
    return message + ": " + std::strerror(errno);
}

void complain(const std::string& message) {
    progressAside();
    std::fprintf(stderr, "korvex-records: %s\n", withoutControls(message).c_str());
}
