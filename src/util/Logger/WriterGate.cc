#include "util/Logger/WriterGate.h"

#include "base/CancelShield.h"

inline namespace korvex {

// What these calls return is not looked at: with mutexes and conditions of these kinds, and one
// user at a time, they cannot fail.

void WriterGate::shut() noexcept {
    if ((_word.fetch_or(kShut, std::memory_order_acquire) & ~kShut) == 0) return;
    const CancelShield shield;  // a thread that is to be cancelled may fork; waiting would end it
    pthread_mutex_lock(&_mutex);
    while (_word.load(std::memory_order_acquire) != kShut)
        pthread_cond_wait(&_empty, &_mutex);
    pthread_mutex_unlock(&_mutex);
}

void WriterGate::leaveShut() noexcept {
    pthread_mutex_lock(&_mutex);
    if (_word.fetch_sub(1, std::memory_order_release) == kShut + 1) pthread_cond_signal(&_empty);
    pthread_mutex_unlock(&_mutex);
}

}  // namespace korvex
