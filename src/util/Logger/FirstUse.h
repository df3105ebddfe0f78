#pragma once

#include <korvex/util/ThreadObj.h>

#include "util/Logger/LoggingLock.h"

#include <atomic>
#include <new>
#include <utility>

inline namespace korvex {

// Holds an object that is built at its first use and never destroyed. It is built under a lock of
// the library, which is taken before a fork. For a static of a function, the C++ library has a lock
// of its own; that lock would stay locked in a child that is forked while another thread builds the
// object.
template <class T>
class FirstUse {
  public:
    template <class... Args>
    T& get(Args&&... args) {
        if (T* const built = _built.load(std::memory_order_acquire)) return *built;
        const LoggingLock lock(_mutex);
        if (T* const built = _built.load(std::memory_order_relaxed)) return *built;
        T* const built = new (_storage) T(std::forward<Args>(args)...);
        _built.store(built, std::memory_order_release);
        return *built;
    }
    // For LoggingLocks.
    Mutex& mutex() { return _mutex; }

  private:
    Mutex _mutex;
    std::atomic<T*> _built{nullptr};
    alignas(T) unsigned char _storage[sizeof(T)];
};

}  // namespace korvex
