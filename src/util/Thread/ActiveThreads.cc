#include "util/Thread/ActiveThreads.h"

#include "base/Assert.h"
#include "base/NeverDestroyed.h"
#include "util/ThreadObj/ThreadLogger.h"

#include <memory>
#include <new>

inline namespace korvex {

TSP_Implementor* ActiveThreads::_ptrs = nullptr;
int ActiveThreads::_nthreads = 0;

namespace {

// Guards the count, and the key's making and end.
Mutex& registryMutex() {
    static NeverDestroyed<Mutex> _mutex;
    return *_mutex;
}

}  // namespace

void ActiveThreads::add(Thread* thrptr) {
    _current = thrptr;
    bool haveKey = false;
    {
        const ScopedMutex lock(registryMutex());
        countIn();
        haveKey = _ptrs != nullptr;
        if (haveKey) setSlot(thrptr);
    }
    if (!haveKey) {
        threadLogger().error(
            "Could not construct ThreadSpecificPointer<Thread> in ActiveThreads::add");
    }
}

// Without the memory for a key nobody would strike the thread off, so it does not count.
void ActiveThreads::countIn() {
    if (_nthreads == 0) {
        KORVEX_ASSERT_AS(_ptrs == nullptr, "_ptrs == NULL");
        _ptrs = new (std::nothrow) TSP_Implementor(&ActiveThreads::remove);
    }
    if (_ptrs != nullptr) ++_nthreads;
}

void ActiveThreads::setSlot(Thread* thrptr) {
    KORVEX_ASSERT_AS(_ptrs->get() == nullptr, "_ptrs->get() == NULL");
    _ptrs->set(thrptr);
}

void ActiveThreads::remove(void*) {
    _current = nullptr;
    const ScopedMutex lock(registryMutex());
    KORVEX_ASSERT_AS(_ptrs != nullptr, "_ptrs != NULL");
    if (--_nthreads > 0) return;
    const std::unique_ptr<TSP_Implementor> last(_ptrs);
    _ptrs = nullptr;
}

}  // namespace korvex
