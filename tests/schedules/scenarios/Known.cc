#include <korvex/util/ThreadObj.h>

#include <atomic>
#include <memory>

#include "explorer/Scenario.h"
#include "scenarios/Parallel.h"

// What is wrong here is known, and must be found: these try the explorer itself.

namespace schedules {

namespace {

void lostUpdate() {
    std::atomic<int> count{0};
    const auto add = [&] { count.store(count.load() + 1); };
    Parallel{add, add}.join();
    require(count == 2, "an update is lost");
}

void lockOrder() {
    Mutex a;
    Mutex b;
    Parallel{[&] {
                 const ScopedMutex first(a);
                 const ScopedMutex second(b);
             },
             [&] {
                 const ScopedMutex first(b);
                 const ScopedMutex second(a);
             }}
        .join();
}

void missedWake() {
    Mutex mutex;
    ConditionWakeAll condition;
    std::atomic<bool> ready{false};
    Parallel threads{[&] {
        if (ready) return;
        const ScopedMutex lock(mutex);
        condition.wait(mutex);
    }};
    ready = true;
    condition.wake_all();
    threads.join();
}

void wokenWithoutCause() {
    Mutex mutex;
    ConditionWakeAll condition;
    bool ready = false;
    Parallel threads{[&] {
        const ScopedMutex lock(mutex);
        if (!ready) condition.wait(mutex);
        require(ready, "woken without a cause");
    }};
    {
        const ScopedMutex lock(mutex);
        ready = true;
    }
    condition.wake_all();
    threads.join();
}

void usedAfterFree() {
    std::atomic<std::atomic<int>*> shared{new std::atomic<int>(1)};
    Parallel{[&] {
                 if (std::atomic<int>* const number = shared) *number = 2;
             },
             [&] { delete shared.exchange(nullptr); }}
        .join();
}

void lockHeldAtFork() {
    Mutex mutex;
    Parallel threads{[&] { const ScopedMutex lock(mutex); }};
    inForkedChild([&] { const ScopedMutex lock(mutex); });
}

const Register registered{
    {"known-lost-update", &lostUpdate, nullptr, "an update is lost"},
    {"known-lock-order", &lockOrder, nullptr, "nobody can go on; thread 0 waits to join"},
    {"known-missed-wake", &missedWake, nullptr, "thread 1 waits to wake from a wait"},
    {"known-spurious-wake", &wokenWithoutCause, nullptr, "woken without a cause"},
    {"known-use-after-free", &usedAfterFree, nullptr, "an object that has been freed"},
    {"known-lock-at-fork", &lockHeldAtFork, nullptr, "in the child of a fork"},
};

}  // namespace

}  // namespace schedules
