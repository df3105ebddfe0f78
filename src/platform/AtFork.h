#pragma once

#include <pthread.h>

// Stand before a function that runs before every static initialiser of the program, there to
// register the library's pthread_atfork(3) handlers. What is registered first is taken last before
// a fork: so any handler of the program may take a lock of its own under which other threads log.
// Among the library's own locks the one that is taken under others comes first: each has a number
// of its own here, as the order of files is the linker's.
#define KORVEX_REGISTERS_LIBC_LOCK __attribute__((constructor(101)))
#define KORVEX_REGISTERS_LOGGING_LOCKS __attribute__((constructor(102)))
#define KORVEX_REGISTERS_THREAD_LOCKS __attribute__((constructor(103)))
#define KORVEX_REGISTERS_STORE_LOCK __attribute__((constructor(104)))
