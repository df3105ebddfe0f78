#include "Receiver.h"

#include <korvex/util/Logger.h>

#include <netdb.h>
#include <poll.h>
#include <sys/socket.h>

#include <cerrno>
#include <stdexcept>

#include "Failure.h"

namespace {

Logger logger("receiver");

constexpr int kAtTheEnd = 1000;  // datagrams: a sender that never stops shall not keep us

}  // namespace

FileDescriptor openPort(const std::string& host, std::int32_t port) {
    const std::string name = host.empty() ? "127.0.0.1" : host;
    const std::string where = "port " + std::to_string(port) + " of " + name;
    struct addrinfo hints {};
    hints.ai_socktype = SOCK_DGRAM;
    struct addrinfo* address = nullptr;
    const int rc = getaddrinfo(name.c_str(), std::to_string(port).c_str(), &hints, &address);
    if (rc != 0) throw std::runtime_error("cannot find " + where + ": " + gai_strerror(rc));
    ScopedFileDescriptor fd(FileDescriptor(socket(address->ai_family, SOCK_DGRAM, 0)));
    const bool bound = fd.valid() && bind(fd.osdep(), address->ai_addr, address->ai_addrlen) == 0;
    const int error = errno;
    freeaddrinfo(address);
    errno = error;
    if (!bound) throw systemFailure("cannot open " + where);
    logger.info("opened " + where);
    return fd.release();
}

Receiver::Receiver(FileDescriptor socket, Counters& counters, const Stop& stop)
    : Thread("receiver"), _socket(socket), _counters(counters), _stop(stop) {}

// What had come before the end is counted still.
void Receiver::main() {
    struct pollfd fds[] = {{_socket.osdep(), POLLIN, 0}, {_stop.fd(), POLLIN, 0}};
    while (fds[1].revents == 0) {
        poll(fds, 2, -1);
        if (fds[0].revents != 0) takeOne();
    }
    for (int n = 0; n < kAtTheEnd && takeOne();)
        ++n;
}

// One datagram: a name, with or without a newline. False when there is none.
bool Receiver::takeOne() {
    char bytes[512];
    const ssize_t n = recv(_socket.osdep(), bytes, sizeof bytes, MSG_DONTWAIT);
    if (n < 0) {
        if (errno != EAGAIN) __extension__ logger.error("cannot receive: %m");
        return false;
    }
    std::string name(bytes, static_cast<std::size_t>(n));
    if (!name.empty() && name.back() == '\n') name.pop_back();
    if (_counters.add(name)) {
        logger.debug("counted " + name);
    } else {
        logger.warn("refused %zd bytes", n);  // which may be anything: they go into no log
    }
    return true;
}
