#include <cerrno>

#include "points/MutexModel.h"

namespace schedules {

void MutexModel::lock(const char* what, const void* caller) {
    if (heldBy == kDestroyed) scheduler().fail("%s of a destroyed lock", what);
    Operation operation{what, this};
    operation.caller = caller;
    operation.ready = &MutexModel::canLock;
    operation.argument = this;
    scheduler().point(operation);
    take();
}

void MutexModel::unlock(const char* what, const void* caller) {
    announce(what, this, caller);
    if (isFree() || heldBy == kDestroyed) scheduler().fail("%s of a lock that is not held", what);
    letGo();
}

}  // namespace schedules

using schedules::MutexModel;

SCHEDULES_WRAP(int, pthread_mutex_init, (pthread_mutex_t * mutex, const pthread_mutexattr_t*)) {
    MutexModel::of(mutex) = MutexModel();
    return 0;
}

SCHEDULES_WRAP(int, pthread_mutex_destroy, (pthread_mutex_t * mutex)) {
    MutexModel& model = MutexModel::of(mutex);
    schedules::announce("destroy a lock", &model, SCHEDULES_CALLER);
    if (!model.isFree()) return EBUSY;
    model.heldBy = MutexModel::kDestroyed;
    return 0;
}

SCHEDULES_WRAP(int, pthread_mutex_lock, (pthread_mutex_t * mutex)) {
    MutexModel::of(mutex).lock("lock", SCHEDULES_CALLER);
    return 0;
}

SCHEDULES_WRAP(int, pthread_mutex_unlock, (pthread_mutex_t * mutex)) {
    MutexModel::of(mutex).unlock("unlock", SCHEDULES_CALLER);
    return 0;
}

SCHEDULES_WRAP(int, pthread_mutex_trylock, (pthread_mutex_t * mutex)) {
    MutexModel& model = MutexModel::of(mutex);
    schedules::announce("try to lock", &model, SCHEDULES_CALLER);
    if (!model.isFree()) return EBUSY;
    model.take();
    return 0;
}
