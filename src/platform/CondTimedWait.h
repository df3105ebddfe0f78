#pragma once

#include <korvex/Export.h>

#include <pthread.h>

#include <ctime>

inline namespace korvex {

// A time some seconds from now, by a monotonic clock if the platform can wait by one.
class KORVEX_HIDDEN Deadline {
  public:
    explicit Deadline(unsigned int seconds);

    const struct timespec& moment() const { return _moment; }

  private:
    struct timespec _moment {};
};

// Waits on a condition with default attributes until the deadline at the latest. 0 when woken,
// ETIMEDOUT when the time is over, else the error.
int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex, const Deadline& deadline);

}  // namespace korvex
