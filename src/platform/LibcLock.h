#pragma once

#include "base/HeldLocks.h"

inline namespace korvex {

// Held, for a scope, around calls of the C library that take its own locks: local time, and the
// texts of error numbers. A child of fork(2) would inherit such a lock locked, and could never
// unlock it. So a fork waits until no thread is in such a scope. If other code calls the same
// functions, a child may still wait for ever; that cannot be prevented here.
class LibcLock {
  public:
    // Never fails: if the lock cannot be taken, only the C library's own lock protects the call.
    LibcLock() noexcept;
    LibcLock(const LibcLock&) = delete;
    LibcLock& operator=(const LibcLock&) = delete;
    ~LibcLock();

    // Whether the calling thread is in such a scope. Then the caller is a signal handler that
    // interrupted it.
    static bool isInside() { return _inside; }

  private:
    static inline thread_local bool _inside = false;

    const HeldLocks::One _mark;
    const bool _outer;  // not within another such scope of this thread
    bool _locked = false;
};

}  // namespace korvex
