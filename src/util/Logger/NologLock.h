#pragma once

#include <korvex/util/ThreadObj.h>

inline namespace korvex {

// Holds a mutex for a scope without ever logging or throwing. A lock that fails is done without:
// a log line that may mix with another one is better than none. (The analysis takes it for held.)
class KORVEX_SCOPED_CAPABILITY NologLock {
  public:
    explicit NologLock(Mutex& mutex) KORVEX_ACQUIRE(mutex) KORVEX_NO_THREAD_SAFETY_ANALYSIS
        : _mutex(mutex),
          _locked(mutex.NOLOG_lock()) {}
    NologLock(const NologLock&) = delete;
    NologLock& operator=(const NologLock&) = delete;
    ~NologLock() KORVEX_RELEASE() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
        if (_locked) _mutex.NOLOG_unlock();
    }

  private:
    Mutex& _mutex;
    const bool _locked;
};

}  // namespace korvex
