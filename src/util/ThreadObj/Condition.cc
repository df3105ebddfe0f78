#include <korvex/util/ThreadObj.h>

#include "platform/CondTimedWait.h"

#include <cerrno>

inline namespace korvex {

ConditionBaseClass::ConditionBaseClass() {
    checkPtRes("pthread_cond_init", pthread_cond_init(&_pthread_cond, nullptr));
}

ConditionBaseClass::~ConditionBaseClass() noexcept(false) {
    checkPtRes("pthread_cond_destroy", pthread_cond_destroy(&_pthread_cond));
}

void ConditionBaseClass::wait(Mutex& mutex) {
    checkPtRes("pthread_cond_wait", pthread_cond_wait(&_pthread_cond, &mutex._pthread_mutex));
}

bool ConditionBaseClass::wait(Mutex& mutex, unsigned int timeoutSecs) {
    return waitUntil(mutex, Deadline(timeoutSecs));
}

bool ConditionBaseClass::waitUntil(Mutex& mutex, const Deadline& deadline) {
    const int rval = condTimedWait(&_pthread_cond, &mutex._pthread_mutex, deadline);
    if (rval != ETIMEDOUT) checkPtRes("pthread_cond_timedwait_relative_np", rval);
    return rval == 0;
}

void ConditionBaseClass::internal_wake_one() {
    checkPtRes("pthread_cond_signal", pthread_cond_signal(&_pthread_cond));
}

void ConditionBaseClass::internal_wake_all() {
    checkPtRes("pthread_cond_broadcast", pthread_cond_broadcast(&_pthread_cond));
}

}  // namespace korvex
