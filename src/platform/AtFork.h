#pragma once

#include <pthread.h>

// These attributes make a function run before all static initialisers of the program. The function
// registers pthread_atfork(3) handlers of the library. Handlers that are registered first run last
// before a fork. So a handler of the program may take a lock under which other threads log. Of the
// library's own locks, one that is taken under others must be registered before them. Each has a
// number here, because the linker decides the order of files.
#define KORVEX_REGISTERS_LIBC_LOCK __attribute__((constructor(101)))
#define KORVEX_REGISTERS_LOGGING_LOCKS __attribute__((constructor(102)))
#define KORVEX_REGISTERS_THREAD_LOCKS __attribute__((constructor(103)))
#define KORVEX_REGISTERS_STORE_LOCK __attribute__((constructor(104)))
