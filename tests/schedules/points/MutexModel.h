#pragma once

#include <pthread.h>

#include "explorer/Races.h"
#include "points/Wrap.h"

namespace schedules {

// A lock as the scheduler sees it, kept in the memory of the pthread_mutex_t, so that it lives,
// dies, and is copied by a fork, as that does. All zero bytes are a free lock, as with glibc.
struct MutexModel {
    static constexpr unsigned kDestroyed = 0xdead;
    unsigned heldBy = 0;  // thread + 1

    bool isFree() const { return heldBy == 0; }

    static MutexModel& of(pthread_mutex_t* mutex) {
        static_assert(sizeof(MutexModel) <= sizeof *mutex);
        return *reinterpret_cast<MutexModel*>(mutex);
    }
    static bool canLock(void* model) { return static_cast<MutexModel*>(model)->isFree(); }

    void take() {
        heldBy = scheduler().running() ? scheduler().self().number + 1 : 1;
        Races::acquire(this);
    }
    void letGo() {
        heldBy = 0;
        Races::release(this);
    }
    void lock(const char* what, const void* caller);
    void unlock(const char* what, const void* caller);
};

}  // namespace schedules
