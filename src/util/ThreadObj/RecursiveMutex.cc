#include <korvex/util/ThreadObj.h>

#include "base/Assert.h"

inline namespace korvex {

void RecursiveMutex::claim() {
    const ScopedMutex lock(_owner_mutex);
    _owner = PthreadToken::self();
    _owner_valid = true;
    _owner_count = 1;
}

// _mutex is held from the first lock to the last unlock. An analysis of single functions cannot
// follow that.
bool RecursiveMutex::tryLock() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    if (_mutex.tryLock()) {
        claim();
        return true;
    }
    const ScopedMutex lock(_owner_mutex);
    if (!_owner_valid || !(_owner == PthreadToken::self())) return false;
    KORVEX_ASSERT(_owner_count > 0);
    ++_owner_count;
    return true;
}

void RecursiveMutex::lock() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    if (tryLock()) return;
    _mutex.lock();
    claim();
}

void RecursiveMutex::unlock() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    {
        const ScopedMutex lock(_owner_mutex);
        KORVEX_ASSERT(_owner_count > 0);
        if (--_owner_count > 0) return;
        _owner_valid = false;
    }
    _mutex.unlock();
}

}  // namespace korvex
