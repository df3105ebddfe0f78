#include "support/TerminalQuery.h"

#include <sys/ioctl.h>
#include <unistd.h>

bool isTerminal(int fd) {
    return isatty(fd) == 1;
}

std::size_t columnsOf(int fd) {
    struct winsize size {};
    const bool known = ioctl(fd, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
    return known ? size.ws_col : 80;
}
