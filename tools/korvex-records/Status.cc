#include "Status.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

std::string withErrno(const std::string& message) {
    return message + ": " + std::strerror(errno);
}

void complain(const std::string& message) {
    std::fprintf(stderr, "korvex-records: %s\n", message.c_str());
}
