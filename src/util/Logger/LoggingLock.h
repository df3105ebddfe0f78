#pragma once

#include <korvex/util/ThreadObj.h>

#include "base/HeldLocks.h"

inline namespace korvex {

// Holds one of the logging system's mutexes for a scope. Never logs and never throws. If the lock
// cannot be taken, the code runs without it: a log line that may mix with another one is better
// than none. (The analysis takes it for held.)
class KORVEX_SCOPED_CAPABILITY LoggingLock {
  public:
    // During a fork, the thread already holds what LoggingLocks took, and a handler of other code
    // that runs between ours may log. That does not hold for the mutex of an appender that is not
    // registered; for this one, `own` is true.
    enum Kind { KEPT_THROUGH_FORKS, OWN };

    explicit LoggingLock(Mutex& mutex, Kind kind = KEPT_THROUGH_FORKS)
        KORVEX_ACQUIRE(mutex) KORVEX_NO_THREAD_SAFETY_ANALYSIS
        : _mutex(mutex),
          _locked(!(kind == KEPT_THROUGH_FORKS && HeldLocks::all()) && mutex.NOLOG_lock()) {}
    LoggingLock(const LoggingLock&) = delete;
    LoggingLock& operator=(const LoggingLock&) = delete;
    ~LoggingLock() KORVEX_RELEASE() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
        if (_locked) _mutex.NOLOG_unlock();
    }

  private:
    const HeldLocks::One _mark;
    Mutex& _mutex;
    const bool _locked;
};

}  // namespace korvex
