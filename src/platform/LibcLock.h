#pragma once

#include "base/HeldLocks.h"

inline namespace korvex {

// Held, for a scope, around what the C library does under locks of its own that a child of fork(2)
// would inherit held and could never free: local time, and the texts of error numbers. A fork waits
// until no thread is there. Code that is not ours and calls the same functions can still leave such
// a child waiting; nothing here can help that.
class LibcLock {
  public:
    // Never fails: where the lock cannot be had, the C library's own must do.
    LibcLock() noexcept;
    LibcLock(const LibcLock&) = delete;
    LibcLock& operator=(const LibcLock&) = delete;
    ~LibcLock();

    // Whether the calling thread is in such a scope, and so who asks a signal handler that
    // interrupted it.
    static bool isInside() { return _inside; }

  private:
    static inline thread_local bool _inside = false;

    const HeldLocks::One _mark;
    const bool _outer;  // not within another such scope of this thread
    bool _locked = false;
};

}  // namespace korvex
