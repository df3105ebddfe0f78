#include "points/ThreadSpecific.h"

#include <pthread.h>

#include <cerrno>

#include "points/Wrap.h"

// Thread-specific values, modelled so that their clean-up belongs to the schedule. A key's number
// is used again after its deletion; a value is one of the key that was there when it was set.

namespace schedules {

namespace {

constexpr unsigned kKeys = 32;
constexpr int kRounds = 4;  // PTHREAD_DESTRUCTOR_ITERATIONS

struct Key {
    unsigned made = 0;  // odd: it exists
    void (*cleanup)(void*) = nullptr;
};

struct Value {
    unsigned made = 0;
    void* pointer = nullptr;
};

Key keys[kKeys];
thread_local Value values[kKeys];

bool exists(pthread_key_t key) {
    return key < kKeys && keys[key].made % 2 == 1;
}

bool cleanUpOnce() {
    bool any = false;
    for (unsigned k = 0; k < kKeys; ++k) {
        void* const pointer = values[k].pointer;
        values[k].pointer = nullptr;
        const bool dead = !exists(k) || values[k].made != keys[k].made;
        if (pointer == nullptr || dead || keys[k].cleanup == nullptr) continue;
        announce("clean up a thread's value", &keys[k], nullptr);
        keys[k].cleanup(pointer);
        any = true;
    }
    return any;
}

}  // namespace

void cleanUpThreadSpecific() {
    for (int round = 0; round < kRounds && cleanUpOnce(); ++round) {
    }
}

}  // namespace schedules

using schedules::exists;
using schedules::keys;
using schedules::values;

SCHEDULES_WRAP(int, pthread_key_create, (pthread_key_t * key, void (*cleanup)(void*))) {
    schedules::announce("make a key", key, SCHEDULES_CALLER);
    for (unsigned k = 0; k < schedules::kKeys; ++k) {
        if (exists(k)) continue;
        ++keys[k].made;
        keys[k].cleanup = cleanup;
        *key = k;
        return 0;
    }
    return EAGAIN;
}

SCHEDULES_WRAP(int, pthread_key_delete, (pthread_key_t key)) {
    if (!exists(key)) return EINVAL;
    schedules::announce("delete a key", &keys[key], SCHEDULES_CALLER);
    ++keys[key].made;
    return 0;
}

SCHEDULES_WRAP(int, pthread_setspecific, (pthread_key_t key, const void* pointer)) {
    if (!exists(key)) return EINVAL;
    schedules::announce("set a thread's value", &keys[key], SCHEDULES_CALLER,
                        schedules::Operation::READS);
    values[key] = {keys[key].made, const_cast<void*>(pointer)};
    return 0;
}

SCHEDULES_WRAP(void*, pthread_getspecific, (pthread_key_t key)) {
    if (!exists(key) || values[key].made != keys[key].made) return nullptr;
    return values[key].pointer;
}
