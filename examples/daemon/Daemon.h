#pragma once

#include <korvex/util/FileDescriptor.h>

// The process's way into the background. The process that was started waits there until the daemon
// is ready, and ends with status 0, or 1 when this object went, or the daemon ended, before that.
class Daemon {
  public:
    // Goes on in a child without a terminal. Only before there are threads. Standard error stays
    // for complaints about the start. Throws std::system_error.
    void begin();
    // Gives standard error up and lets the waiting process end. Nothing in the foreground.
    void ready();

  private:
    ScopedFileDescriptor _waiting;  // a pipe to the waiting process; none in the foreground
};
