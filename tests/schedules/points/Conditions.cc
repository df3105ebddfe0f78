#include <cerrno>
#include <ctime>

#include "points/MutexModel.h"

namespace schedules {

namespace {

// A condition keeps nothing but whether it lives; who waits is in the threads' states.
struct ConditionModel {
    static constexpr unsigned kDestroyed = 0xdead;
    unsigned state = 0;

    static ConditionModel& of(pthread_cond_t* condition) {
        return *reinterpret_cast<ConditionModel*>(condition);
    }
    void mustLive(const char* what) const {
        if (state == kDestroyed) scheduler().fail("%s a destroyed condition", what);
    }
};

struct Wait {
    ThreadState& thread;
    MutexModel& mutex;

    static bool isOver(void* wait) {
        const Wait& w = *static_cast<Wait*>(wait);
        return w.thread.signalled && w.mutex.isFree();
    }
};

int waitFor(pthread_cond_t* condition, MutexModel& mutex, Operation::Patience patience,
            const void* caller) {
    ConditionModel::of(condition).mustLive("wait on");
    announce("wait: let go of the lock", &mutex, caller);
    ThreadState& self = scheduler().self();
    mutex.letGo();
    self.condition = condition;
    self.signalled = false;
    self.waitsSince = scheduler().nextWait();
    Wait wait{self, mutex};
    Operation woken{"wake from a wait", condition};
    woken.caller = caller;
    woken.ready = &Wait::isOver;
    woken.argument = &wait;
    woken.patience = patience;
    woken.mayWake = true;
    const Turn turn = scheduler().point(woken);
    self.condition = nullptr;
    if (turn == Turn::READY) {
        mutex.take();
    } else {
        mutex.lock("lock again after a wait", caller);
    }
    return turn == Turn::TIMED_OUT ? ETIMEDOUT : 0;
}

// The one that has waited longest, or all.
void wake(pthread_cond_t* condition, bool all) {
    ConditionModel::of(condition).mustLive("wake");
    ThreadState* longest = nullptr;
    for (ThreadState* t = scheduler().begin_threads(); t != scheduler().end_threads(); ++t) {
        if (t->life != ThreadState::ALIVE || t->condition != condition || t->signalled) continue;
        if (all) t->signalled = true;
        if (longest == nullptr || t->waitsSince < longest->waitsSince) longest = t;
    }
    if (longest != nullptr) longest->signalled = true;
}

}  // namespace

}  // namespace schedules

using schedules::ConditionModel;
using schedules::MutexModel;
using schedules::Operation;

SCHEDULES_WRAP(int, pthread_cond_init, (pthread_cond_t * condition, const pthread_condattr_t*)) {
    ConditionModel::of(condition) = ConditionModel();
    return 0;
}

SCHEDULES_WRAP(int, pthread_cond_destroy, (pthread_cond_t * condition)) {
    schedules::announce("destroy a condition", condition, SCHEDULES_CALLER);
    auto& scheduler = schedules::scheduler();
    for (auto* t = scheduler.begin_threads(); t != scheduler.end_threads(); ++t) {
        if (t->life == schedules::ThreadState::ALIVE && t->condition == condition && !t->signalled)
            scheduler.fail("a condition is destroyed while thread %u waits on it", t->number);
    }
    ConditionModel::of(condition).state = ConditionModel::kDestroyed;
    return 0;
}

SCHEDULES_WRAP(int, pthread_cond_wait, (pthread_cond_t * condition, pthread_mutex_t* mutex)) {
    return schedules::waitFor(condition, MutexModel::of(mutex), Operation::FOREVER,
                              SCHEDULES_CALLER);
}

SCHEDULES_WRAP(int, pthread_cond_clockwait,
               (pthread_cond_t * condition, pthread_mutex_t* mutex, clockid_t,
                const struct timespec*)) {
    return schedules::waitFor(condition, MutexModel::of(mutex), Operation::MAY_TIME_OUT,
                              SCHEDULES_CALLER);
}

SCHEDULES_WRAP(int, pthread_cond_signal, (pthread_cond_t * condition)) {
    schedules::announce("wake one", condition, SCHEDULES_CALLER);
    schedules::wake(condition, false);
    return 0;
}

SCHEDULES_WRAP(int, pthread_cond_broadcast, (pthread_cond_t * condition)) {
    schedules::announce("wake all", condition, SCHEDULES_CALLER);
    schedules::wake(condition, true);
    return 0;
}
