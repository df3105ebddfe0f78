#pragma once

// What the linker knows some calls as. Where a 32-bit machine is given a 64-bit time_t and off_t,
// the C library's headers rename them (WrappedCalls.cmake has the same list).
#if defined(_TIME_BITS) && _TIME_BITS == 64 && __SIZEOF_POINTER__ == 4
#define LINK_NAME_open "open64"
#define LINK_NAME_fcntl "__fcntl_time64"
#define LINK_NAME_fstat "__fstat64_time64"
#define LINK_NAME_stat "__stat64_time64"
#define LINK_NAME_lseek "lseek64"
#define LINK_NAME_fopen "fopen64"
#define LINK_NAME_gettimeofday "__gettimeofday64"
#define LINK_NAME_localtime_r "__localtime64_r"
#define LINK_NAME_pthread_cond_clockwait "__pthread_cond_clockwait64"
#else
#define LINK_NAME_open "open"
#define LINK_NAME_fcntl "fcntl"
#define LINK_NAME_fstat "fstat"
#define LINK_NAME_stat "stat"
#define LINK_NAME_lseek "lseek"
#define LINK_NAME_fopen "fopen"
#define LINK_NAME_gettimeofday "gettimeofday"
#define LINK_NAME_localtime_r "localtime_r"
#define LINK_NAME_pthread_cond_clockwait "pthread_cond_clockwait"
#endif
