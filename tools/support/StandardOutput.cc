#include "support/StandardOutput.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <string>

namespace {

[[noreturn]] void lost() {
    throw std::runtime_error(std::string("standard output: ") + std::strerror(errno));
}

}  // namespace

void writeOutput(std::string_view bytes) {
    if (bytes.empty()) return;  // it may be of no array at all
    if (std::fwrite(bytes.data(), 1, bytes.size(), stdout) != bytes.size()) lost();
}

// Some file systems tell a full disk only when the file is closed.
void finishOutput() {
    if (std::fflush(stdout) != 0) lost();
    const int fd = dup(STDOUT_FILENO);
    if (fd < 0 || close(fd) != 0) lost();
}
