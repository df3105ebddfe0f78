#pragma once

#include <korvex/util/FileDescriptor.h>

// Tells every worker to end, and wakes those that wait in poll(2).
class Stop {
  public:
    // Throws std::runtime_error.
    Stop();
    // From now on poll(2) finds events on fd().
    void now() { _writeEnd.close(); }
    int fd() const { return _readEnd.osdep(); }

  private:
    ScopedFileDescriptor _readEnd;
    ScopedFileDescriptor _writeEnd;
};
