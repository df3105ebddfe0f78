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

// A thread that cannot be registered still runs. It is not counted, and so not removed when it
// ends.
bool ActiveThreads::add(Thread::Gate& gate) {
    _current = &gate;
    bool registered = false;
    try {
        registered = countIn(gate);
    } catch (const std::exception&) {  // no key, or no room for the slot: told by the check
    }
    if (!registered) {
        threadLogger().error(
            "Could not construct ThreadSpecificPointer<Thread> in ActiveThreads::add");
    }
    return registered;
}

bool ActiveThreads::countIn(Thread::Gate& gate) {
    const ScopedMutex lock(mutex());
    std::unique_ptr<TSP_Implementor> made;
    if (_nthreads == 0) {
        KORVEX_ASSERT_AS(_ptrs == nullptr, "_ptrs == NULL");
        made.reset(new (std::nothrow) TSP_Implementor(&ActiveThreads::remove));
        if (made == nullptr) return false;
    }
    setSlot(made != nullptr ? *made : *_ptrs, gate);
    if (made != nullptr) _ptrs = made.release();
    ++_nthreads;
    return true;
}

// The slot keeps the gate for what else runs when the thread ends.
void ActiveThreads::setSlot(TSP_Implementor& ptrs, Thread::Gate& gate) {
    KORVEX_ASSERT_AS(ptrs.get() == nullptr, "_ptrs->get() == NULL");
    auto kept = std::make_unique<std::shared_ptr<Thread::Gate>>(gate.shared_from_this());
    ptrs.set(kept.get());
    static_cast<void>(kept.release());
}

void ActiveThreads::remove(void* slot) {
    _current = nullptr;
    const std::unique_ptr<std::shared_ptr<Thread::Gate>> kept(
        static_cast<std::shared_ptr<Thread::Gate>*>(slot));
    const ScopedMutex lock(mutex());
    KORVEX_ASSERT_AS(_ptrs != nullptr, "_ptrs != NULL");
    if (--_nthreads > 0) return;
    const std::unique_ptr<TSP_Implementor> last(_ptrs);
    _ptrs = nullptr;
}

void ActiveThreads::takeLocks() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    Mutex& gates = Thread::Gate::readyToRunLock();
    mutex().NOLOG_lock();
    gates.NOLOG_lock();
}

void ActiveThreads::freeLocks() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    Thread::Gate::readyToRunLock().NOLOG_unlock();
    mutex().NOLOG_unlock();
}

}  // namespace korvex
