#include <cstddef>
#include <cstring>

#include "explorer/Races.h"
#include "points/Wrap.h"

// What else -fsanitize=thread calls: plain accesses. They are no points, because of two that are
// not ordered by points one is a race, wherever the other is.

using schedules::Races;

#define ACCESS(name, size, writes)                            \
    extern "C" void __tsan_##name(void* where);               \
    extern "C" void __tsan_##name(void* where) {              \
        Races::access(where, size, writes, SCHEDULES_CALLER); \
    }
#define SIZES(name, writes)    \
    ACCESS(name##1, 1, writes) \
    ACCESS(name##2, 2, writes) \
    ACCESS(name##4, 4, writes) \
    ACCESS(name##8, 8, writes) \
    ACCESS(name##16, 16, writes)

SIZES(read, false)
SIZES(write, true)
SIZES(unaligned_read, false)
SIZES(unaligned_write, true)
SIZES(volatile_read, false)
SIZES(volatile_write, true)
ACCESS(vptr_read, sizeof(void*), false)

extern "C" {
void __tsan_init();
void __tsan_func_entry(void*);
void __tsan_func_exit();
void __tsan_vptr_update(void** where, void* value);
void __tsan_read_range(void* where, std::size_t size);
void __tsan_write_range(void* where, std::size_t size);

void __tsan_init() {}
void __tsan_func_entry(void*) {}
void __tsan_func_exit() {}
// A destructor that begins writes the pointer that is there already.
void __tsan_vptr_update(void** where, void* value) {
    if (*where != value) Races::access(where, sizeof value, true, SCHEDULES_CALLER);
}
void __tsan_read_range(void* where, std::size_t size) {
    Races::access(where, size, false, SCHEDULES_CALLER);
}
void __tsan_write_range(void* where, std::size_t size) {
    Races::access(where, size, true, SCHEDULES_CALLER);
}
}

// clang++ has names of its own for what is copied.
extern "C" {
void* __tsan_memcpy(void* to, const void* from, size_t size);
void* __tsan_memmove(void* to, const void* from, size_t size);
void* __tsan_memset(void* to, int value, size_t size);
}

SCHEDULES_REAL(void*, memcpy, (void*, const void*, size_t));
SCHEDULES_REAL(void*, memmove, (void*, const void*, size_t));
SCHEDULES_REAL(void*, memset, (void*, int, size_t));

SCHEDULES_WRAP(void*, memcpy, (void* to, const void* from, size_t size)) {
    Races::access(from, size, false, SCHEDULES_CALLER);
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memcpy(to, from, size);
}

void* __tsan_memcpy(void* to, const void* from, size_t size) {
    Races::access(from, size, false, SCHEDULES_CALLER);
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memcpy(to, from, size);
}

SCHEDULES_WRAP(void*, memmove, (void* to, const void* from, size_t size)) {
    Races::access(from, size, false, SCHEDULES_CALLER);
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memmove(to, from, size);
}

void* __tsan_memmove(void* to, const void* from, size_t size) {
    Races::access(from, size, false, SCHEDULES_CALLER);
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memmove(to, from, size);
}

SCHEDULES_WRAP(void*, memset, (void* to, int value, size_t size)) {
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memset(to, value, size);
}

void* __tsan_memset(void* to, int value, size_t size) {
    Races::access(to, size, true, SCHEDULES_CALLER);
    return __real_memset(to, value, size);
}
