#include "platform/LibcLock.h"

#include "platform/AtFork.h"

inline namespace korvex {

namespace {

// Needs no construction, because static initialisers may log.
pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;

// For the thread that forks: a handler of other code that runs between ours may log.
thread_local bool heldForFork = false;

void take() {
    heldForFork = pthread_mutex_lock(&mutex) == 0;
}

void giveBack() {
    if (!heldForFork) return;
    heldForFork = false;
    pthread_mutex_unlock(&mutex);
}

KORVEX_REGISTERS_LIBC_LOCK void keepThroughForks() {
    pthread_atfork(&take, &giveBack, &giveBack);
}

}  // namespace

LibcLock::LibcLock() noexcept : _outer(!_inside) {
    if (!_outer) return;
    _inside = true;
    _locked = !heldForFork && pthread_mutex_lock(&mutex) == 0;
}

LibcLock::~LibcLock() {
    if (_locked) pthread_mutex_unlock(&mutex);
    if (_outer) _inside = false;
}

}  // namespace korvex
