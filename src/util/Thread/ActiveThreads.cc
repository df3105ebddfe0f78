#include "util/Thread/ActiveThreads.h"

#include "base/Assert.h"
#include "base/NeverDestroyed.h"
#include "util/ThreadObj/ThreadLogger.h"

#include <exception>
#include <memory>
#include <new>

inline namespace korvex {

TSP_Implementor* ActiveThreads::_ptrs = nullptr;
int ActiveThreads::_nthreads = 0;

Mutex& ActiveThreads::mutex() {
    static NeverDestroyed<Mutex> _mutex;
    return *_mutex;
}

// A thread that cannot be registered runs all the same: it is not counted, so nobody waits for it
// to be struck off.
void ActiveThreads::add(Thread* thrptr) {
    _current = thrptr;
    bool registered = false;
    try {
        registered = countIn(thrptr);
    } catch (const std::exception&) {  // no key, or no room for the slot: told by the check
    }
    if (!registered) {
        threadLogger().error(
            "Could not construct ThreadSpecificPointer<Thread> in ActiveThreads::add");
    }
}

bool ActiveThreads::countIn(Thread* thrptr) {
    const ScopedMutex lock(mutex());
    std::unique_ptr<TSP_Implementor> made;
    if (_nthreads == 0) {
        KORVEX_ASSERT_AS(_ptrs == nullptr, "_ptrs == NULL");
        made.reset(new (std::nothrow) TSP_Implementor(&ActiveThreads::remove));
        if (made == nullptr) return false;
    }
    setSlot(made != nullptr ? *made : *_ptrs, thrptr);
    if (made != nullptr) _ptrs = made.release();
    ++_nthreads;
    return true;
}

void ActiveThreads::setSlot(TSP_Implementor& ptrs, Thread* thrptr) {
    KORVEX_ASSERT_AS(ptrs.get() == nullptr, "_ptrs->get() == NULL");
    ptrs.set(thrptr);
}

void ActiveThreads::remove(void*) {
    _current = nullptr;
    const ScopedMutex lock(mutex());
    KORVEX_ASSERT_AS(_ptrs != nullptr, "_ptrs != NULL");
    if (--_nthreads > 0) return;
    const std::unique_ptr<TSP_Implementor> last(_ptrs);
    _ptrs = nullptr;
}

}  // namespace korvex
