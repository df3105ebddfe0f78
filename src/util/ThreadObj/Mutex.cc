#include <korvex/util/ThreadObj.h>

#include <cerrno>

inline namespace korvex {

Mutex::Mutex() {
    checkPtRes("pthread_mutex_init", pthread_mutex_init(&_pthread_mutex, nullptr));
}

Mutex::~Mutex() noexcept(false) {
    checkPtRes("pthread_mutex_destroy", pthread_mutex_destroy(&_pthread_mutex));
}

void Mutex::lock() {
    checkPtRes("pthread_mutex_lock", pthread_mutex_lock(&_pthread_mutex));
}

void Mutex::unlock() {
    checkPtRes("pthread_mutex_unlock", pthread_mutex_unlock(&_pthread_mutex));
}

bool Mutex::tryLock() {
    const int rval = pthread_mutex_trylock(&_pthread_mutex);
    if (rval != EBUSY) checkPtRes("pthread_mutex_trylock", rval);
    return rval == 0;
}

bool Mutex::NOLOG_lock() {
    return pthread_mutex_lock(&_pthread_mutex) == 0;
}

int Mutex::NOLOG_unlock() {
    return pthread_mutex_unlock(&_pthread_mutex);
}

}  // namespace korvex
