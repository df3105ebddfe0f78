#pragma once

#include <pthread.h>

inline namespace korvex {

// Waits on a condition with default attributes for at most `seconds` from now, by a clock that
// nobody sets where the platform can. 0 when woken, ETIMEDOUT when the time is over, else the
// error.
int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex, unsigned int seconds);

}  // namespace korvex
