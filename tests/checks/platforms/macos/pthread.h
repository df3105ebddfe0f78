#pragma once
#pragma GCC system_header
#include_next <pthread.h>

// What macOS has in its header.
extern "C" int pthread_cond_timedwait_relative_np(pthread_cond_t*, pthread_mutex_t*,
                                                  const struct timespec*);
