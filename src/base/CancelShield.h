#pragma once

#include <pthread.h>

inline namespace korvex {

// Defers pthread_cancel(3) of the calling thread for a scope that must be completed, or that must
// not throw: a cancellation throws.
class CancelShield {
  public:
    CancelShield() { pthread_setcancelstate(PTHREAD_CANCEL_DISABLE, &_before); }
    CancelShield(const CancelShield&) = delete;
    CancelShield& operator=(const CancelShield&) = delete;
    ~CancelShield() { pthread_setcancelstate(_before, nullptr); }

  private:
    int _before = PTHREAD_CANCEL_ENABLE;
};

}  // namespace korvex
