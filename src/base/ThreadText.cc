#include "base/ThreadText.h"

#include <pthread.h>

#include <new>

inline namespace korvex {

void ThreadText::dropTexts(void* dropped) {
    _nothingKept = true;
    _texts = nullptr;
    delete static_cast<Texts*>(dropped);
}

namespace {

pthread_key_t key;

}  // namespace

bool ThreadText::makeKey() noexcept {
    static const bool haveKey = pthread_key_create(&key, dropTexts) == 0;
    return haveKey;
}

// A thread-specific key detects the end of the thread. A thread_local object would not do: to
// register one may end the process if memory runs out.
ThreadText::Texts* ThreadText::makeTexts() noexcept {
    if (_nothingKept) return nullptr;
    _nothingKept = true;  // until all has gone well
    Texts* const made = makeKey() ? new (std::nothrow) Texts : nullptr;
    if (made == nullptr) return nullptr;
    if (pthread_setspecific(key, made) != 0) {
        delete made;
        return nullptr;
    }
    _nothingKept = false;
    return _texts = made;
}

}  // namespace korvex
