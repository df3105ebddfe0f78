#include "platform/CondTimedWait.h"

#include <algorithm>
#include <limits>

#if defined(__GLIBC__) && (__GLIBC__ > 2 || __GLIBC_MINOR__ >= 30)
#define KORVEX_HAS_CLOCKWAIT 1
#endif

inline namespace korvex {

namespace {

// macOS takes a duration, glibc a time of a chosen clock, POSIX a time of the wall clock.
#if defined(__APPLE__) || defined(KORVEX_HAS_CLOCKWAIT)
constexpr clockid_t kClock = CLOCK_MONOTONIC;
#else
constexpr clockid_t kClock = CLOCK_REALTIME;
#endif

#if defined(__APPLE__)
// The remaining time; zero when the time is over.
struct timespec untilThen(const struct timespec& then) {
    struct timespec now {};
    clock_gettime(kClock, &now);
    struct timespec left {
        then.tv_sec - now.tv_sec, then.tv_nsec - now.tv_nsec
    };
    if (left.tv_nsec < 0) {
        left.tv_sec -= 1;
        left.tv_nsec += 1000000000;
    }
    return left.tv_sec < 0 ? timespec{} : left;
}
#endif

}  // namespace

Deadline::Deadline(unsigned int seconds) {
    clock_gettime(kClock, &_moment);
    // A 32-bit time_t cannot hold every sum.
    const long long most = std::numeric_limits<time_t>::max();
    _moment.tv_sec = static_cast<time_t>(
        std::min(static_cast<long long>(_moment.tv_sec) + static_cast<long long>(seconds), most));
}

int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex, const Deadline& deadline) {
#if defined(__APPLE__)
    const struct timespec left = untilThen(deadline.moment());
    return pthread_cond_timedwait_relative_np(cond, mutex, &left);
#elif defined(KORVEX_HAS_CLOCKWAIT)
    return pthread_cond_clockwait(cond, mutex, kClock, &deadline.moment());
#else
    return pthread_cond_timedwait(cond, mutex, &deadline.moment());
#endif
}

}  // namespace korvex
