#include "Output.h"

#include <unistd.h>

#include <cstdio>

#include "Progress.h"
#include "Status.h"
#include "Terminal.h"

namespace {

[[noreturn]] void lost() {
    throw Failure(IO_ERROR, withErrno("standard output"));
}

}  // namespace

void write(std::string_view bytes) {
    static const bool isShown = isTerminal(STDOUT_FILENO);
    if (isShown) progressAside();
    if (std::fwrite(bytes.data(), 1, bytes.size(), stdout) != bytes.size()) lost();
}

// Some file systems tell a full disk only when the file is closed.
void finishOutput() {
    if (std::fflush(stdout) != 0) lost();
    const int fd = dup(STDOUT_FILENO);
    if (fd < 0 || close(fd) != 0) lost();
}
