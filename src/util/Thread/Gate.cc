#include "util/Thread/Gate.h"

#include "base/Assert.h"
#include "base/NeverDestroyed.h"

inline namespace korvex {

Mutex& Thread::Gate::readyToRunLock() {
    static NeverDestroyed<Mutex> ready_to_run_lock;
    return *ready_to_run_lock;
}

void Thread::Gate::open() {
    const ScopedMutex lock(readyToRunLock());
    KORVEX_ASSERT(!_ready_to_run);
    _ready_to_run = true;
    _ready_to_run_cond.wake_all();
}

void Thread::Gate::abandon() {
    const ScopedMutex lock(readyToRunLock());
    _thread.store(nullptr, std::memory_order_release);
    _ready_to_run_cond.wake_all();
}

Thread* Thread::Gate::pass() {
    ScopedMutex lock(readyToRunLock());
    while (!_ready_to_run && thread() != nullptr)
        _ready_to_run_cond.wait(lock);
    return thread();
}

}  // namespace korvex
