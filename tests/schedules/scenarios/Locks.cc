#include <korvex/util/ThreadObj.h>

#include <atomic>
#include <memory>

#include "explorer/Scenario.h"
#include "scenarios/Parallel.h"

// The wrappers of locks, conditions and thread-specific pointers.

namespace schedules {

namespace {

void recursive() {
    RecursiveMutex mutex;
    int inside = 0;
    const auto enter = [&] {
        mutex.lock();
        require(inside++ == 0, "two threads hold the lock");
        require(mutex.tryLock(), "the owner cannot lock again");
        mutex.unlock();
        --inside;
        mutex.unlock();
    };
    Parallel threads{enter};
    if (mutex.tryLock()) {
        require(inside++ == 0, "two threads hold the lock");
        --inside;
        mutex.unlock();
    }
    enter();
    threads.join();
    require(mutex.tryLock(), "the lock is not free at the end");
    mutex.unlock();
}

void conditionWithTime() {
    Mutex mutex;
    ConditionWakeAll condition;
    bool ready = false;
    bool seen = false;
    Parallel threads{[&] {
        const ScopedMutex lock(mutex);
        for (int tries = 0; tries < 2 && !ready; ++tries)
            condition.wait(mutex, 1);
        seen = ready;
    }};
    {
        const ScopedMutex lock(mutex);
        ready = true;
        condition.wake_all();
    }
    threads.join();
    require(seen || ready, "the condition is lost");
}

void twoWaiters() {
    Mutex mutex;
    ConditionWakeAll condition;
    bool ready = false;
    const auto wait = [&] {
        const ScopedMutex lock(mutex);
        while (!ready)
            condition.wait(mutex);
    };
    Parallel threads{wait, wait};
    {
        const ScopedMutex lock(mutex);
        ready = true;
    }
    condition.wake_all();
    threads.join();
}

struct Counted {
    explicit Counted(std::atomic<int>& count) : _count(count) { ++_count; }
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;
    ~Counted() { --_count; }

  private:
    std::atomic<int>& _count;
};

void specific() {
    std::atomic<int> alive{0};
    ThreadSpecificPointer<Counted> pointer;
    const auto use = [&] {
        require(pointer.get() == nullptr, "a thread has another one's object");
        pointer.set(new Counted(alive));
        pointer.set(new Counted(alive));
    };
    Parallel{use, use}.join();
    require(alive == 0, "not every object has been deleted with its thread");
}

const Register registered{
    {"lock-recursive", &recursive},
    {"condition-two-waiters", &twoWaiters},
    {"condition-with-time", &conditionWithTime},
    {"thread-specific-pointers", &specific},
};

}  // namespace

}  // namespace schedules
