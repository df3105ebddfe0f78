#pragma once

#include <pthread.h>

// A function that runs before every static initialiser of the program, there to register the
// library's pthread_atfork(3) handlers. What is registered first is taken last before a fork: so
// any handler of the program may take a lock of its own under which other threads log. Those marked
// as second are taken before those marked as first.
#define KORVEX_FIRST_AT_START_UP __attribute__((constructor(101)))
#define KORVEX_SECOND_AT_START_UP __attribute__((constructor(102)))
