# The library calls that tests can make fail (support/Faults.cc has one hook for each).
set(KORVEX_WRAPPED_CALLS
  open read write writev close fstat stat access lseek fcntl fsync rename unlink
  fopen fread fwrite fclose calloc fgets
  gettimeofday localtime_r strftime __xpg_strerror_r setenv
  pthread_create pthread_join pthread_attr_init pthread_attr_setstacksize
  pthread_mutex_init pthread_mutex_destroy pthread_mutex_lock pthread_mutex_unlock
  pthread_mutex_trylock pthread_cond_init pthread_cond_wait pthread_cond_clockwait
  pthread_key_create pthread_setspecific poptGetContext)

# Where a 32-bit machine is given a 64-bit time_t and off_t, some have other names (LinkNames.h).
include(CheckTypeSize)
list(TRANSFORM KORVEX_WIDE_TYPES PREPEND -D OUTPUT_VARIABLE CMAKE_REQUIRED_DEFINITIONS)
check_type_size(time_t SIZE_OF_TIME_T LANGUAGE CXX)
if(CMAKE_SIZEOF_VOID_P EQUAL 4 AND SIZE_OF_TIME_T EQUAL 8)
  list(REMOVE_ITEM KORVEX_WRAPPED_CALLS
    open fcntl fstat stat lseek fopen gettimeofday localtime_r pthread_cond_clockwait)
  list(APPEND KORVEX_WRAPPED_CALLS
    open64 __fcntl_time64 __fstat64_time64 __stat64_time64 lseek64 fopen64 __gettimeofday64
    __localtime64_r __pthread_cond_clockwait64)
endif()
