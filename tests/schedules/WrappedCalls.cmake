# The calls at which the threads of a run meet; points/ has a function for each.
set(KORVEX_SCHEDULED_CALLS
  pthread_mutex_init pthread_mutex_destroy pthread_mutex_lock pthread_mutex_unlock
  pthread_mutex_trylock pthread_cond_init pthread_cond_destroy pthread_cond_wait
  pthread_cond_clockwait pthread_cond_signal pthread_cond_broadcast
  pthread_create pthread_join pthread_detach
  pthread_key_create pthread_key_delete pthread_setspecific pthread_getspecific
  __cxa_guard_acquire __cxa_guard_release __cxa_guard_abort
  pthread_atfork fork waitpid exit
  write open rename unlink stat access close fopen fwrite fclose
  gettimeofday localtime_r strftime __xpg_strerror_r vsnprintf calloc free
  memcpy memmove memset)
