# The library calls that tests can make fail (support/Faults.cc has one hook for each).
set(KORVEX_WRAPPED_CALLS
  open read write writev close fstat stat access lseek fcntl fsync rename unlink
  fopen fread fwrite fclose calloc fgets
  gettimeofday localtime_r strftime __xpg_strerror_r setenv
  pthread_create pthread_join pthread_attr_init pthread_attr_setstacksize
  pthread_mutex_init pthread_mutex_destroy pthread_mutex_lock pthread_mutex_unlock
  pthread_mutex_trylock pthread_cond_init pthread_cond_wait pthread_cond_clockwait
  pthread_key_create pthread_setspecific poptGetContext)
