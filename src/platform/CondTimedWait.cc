#include "platform/CondTimedWait.h"

#include <algorithm>
#include <ctime>
#include <limits>

inline namespace korvex {

#if defined(__APPLE__)

int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex, unsigned int seconds) {
    const struct timespec relative { static_cast<time_t>(seconds), 0 };
    return pthread_cond_timedwait_relative_np(cond, mutex, &relative);
}

#else

namespace {

struct timespec secondsFromNow(clockid_t clock, unsigned int seconds) {
    struct timespec until {};
    clock_gettime(clock, &until);
    // A time_t of 32 bits cannot hold every sum.
    const long long most = std::numeric_limits<time_t>::max();
    until.tv_sec = static_cast<time_t>(
        std::min(static_cast<long long>(until.tv_sec) + static_cast<long long>(seconds), most));
    return until;
}

}  // namespace

int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex, unsigned int seconds) {
#if defined(__GLIBC__) && (__GLIBC__ > 2 || __GLIBC_MINOR__ >= 30)
    const struct timespec until = secondsFromNow(CLOCK_MONOTONIC, seconds);
    return pthread_cond_clockwait(cond, mutex, CLOCK_MONOTONIC, &until);
#else
    const struct timespec until = secondsFromNow(CLOCK_REALTIME, seconds);
    return pthread_cond_timedwait(cond, mutex, &until);
#endif
}

#endif

}  // namespace korvex
