#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Thread.h>

#include <cstdint>
#include <string>

#include "Counters.h"
#include "Stop.h"

// A UDP socket at the port of the host, 127.0.0.1 if it is empty. Throws std::runtime_error.
FileDescriptor openPort(const std::string& host, std::int32_t port);

// The worker that counts what comes.
class Receiver : public Thread {
  public:
    // Takes ownership of the socket.
    Receiver(FileDescriptor socket, Counters& counters, const Stop& stop);

  private:
    void main() override;
    bool takeOne();

    const ScopedFileDescriptor _socket;
    Counters& _counters;
    const Stop& _stop;
};
