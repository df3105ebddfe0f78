#include <korvex/util/ThreadObj.h>

#include <exception>

inline namespace korvex {

namespace {

// For use in a destructor: it must not throw while another exception propagates.
template <class Work>
void unlessUnwinding(int exceptionsBefore, Work work) {
    try {
        work();
    } catch (...) {
        if (std::uncaught_exceptions() == exceptionsBefore) throw;
    }
}

}  // namespace

ScopedMutex::ScopedMutex(Mutex& mutex) : _mutex(mutex), _exceptions(std::uncaught_exceptions()) {
    _mutex.lock();
}

ScopedMutex::~ScopedMutex() noexcept(false) {
    unlessUnwinding(_exceptions, [this]() KORVEX_NO_THREAD_SAFETY_ANALYSIS { _mutex.unlock(); });
}

ScopedMutexUnlocker::ScopedMutexUnlocker(Mutex& mutex)
    : _mutex(mutex), _exceptions(std::uncaught_exceptions()) {
    _mutex.unlock();
}

ScopedMutexUnlocker::~ScopedMutexUnlocker() noexcept(false) {
    unlessUnwinding(_exceptions, [this]() KORVEX_NO_THREAD_SAFETY_ANALYSIS { _mutex.lock(); });
}

}  // namespace korvex
