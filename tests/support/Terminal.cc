#include "support/Terminal.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>

namespace testsupport {

namespace {

constexpr std::chrono::seconds kPatience(30);

}  // namespace

Terminal::Terminal(unsigned short columns) : _other(posix_openpt(O_RDWR | O_NOCTTY)) {
    if (_other < 0 || grantpt(_other) != 0 || unlockpt(_other) != 0) std::abort();
    _own = open(name().c_str(), O_RDWR | O_NOCTTY);
    struct winsize size {};
    size.ws_col = columns;
    size.ws_row = 25;
    struct termios modes {};
    if (ioctl(_own, TIOCSWINSZ, &size) != 0 || tcgetattr(_own, &modes) != 0) std::abort();
    modes.c_oflag &= ~static_cast<tcflag_t>(OPOST);
    if (tcsetattr(_own, TCSANOW, &modes) != 0) std::abort();
}

Terminal::~Terminal() {
    close(_own);
    close(_other);
}

void Terminal::becomes(int fd) const {
    dup2(_own, fd);
}

void Terminal::takeOver() const {
    setsid();
    ioctl(_own, TIOCSCTTY, 0);
    for (const int fd : {0, 1, 2})
        dup2(_own, fd);
    close(_other);  // so that the shell gets its SIGHUP when the test is gone
}

std::string Terminal::name() const {
    return ptsname(_other);
}

void Terminal::type(const std::string& text) const {
    if (write(_other, text.data(), text.size()) < 0) std::perror("type");
}

bool Terminal::look(int milliseconds) {
    struct pollfd wanted {};
    wanted.fd = _other;
    wanted.events = POLLIN;
    if (poll(&wanted, 1, milliseconds) <= 0) return false;
    char buf[4096];
    const ssize_t got = read(_other, buf, sizeof buf);
    if (got > 0) _seen.append(buf, static_cast<std::size_t>(got));
    return got > 0;
}

bool Terminal::shows(const std::string& text) {
    const auto end = std::chrono::steady_clock::now() + kPatience;
    while (_seen.find(text) == _seen.npos) {
        if (std::chrono::steady_clock::now() > end) return false;
        look(100);
    }
    return true;
}

// What is written may come in pieces, and late: the mark comes last.
std::string Terminal::shown() {
    const char mark = '\004';
    if (write(_own, &mark, 1) != 1 || !shows(std::string(1, mark))) return "(the mark is lost)";
    return _seen.substr(0, _seen.find(mark));
}

}  // namespace testsupport
