#include <cstdint>

#include "points/Wrap.h"

// The library of this test is compiled with -fsanitize=thread, and not linked with the sanitizer's
// run-time library: the calls that the compiler puts in for every atomic access come here. So there
// is no hook in the library's own code.

namespace schedules {

namespace {

constexpr unsigned kMostLooks = 1000;

bool othersHaveRun(void* thread) {
    return static_cast<ThreadState*>(thread)->seenAtTurn != scheduler().turns();
}

// A thread that looks again at what it has just seen, nobody else having run, sees it again. A
// loop that waits like that would be nothing but points. It makes none until it has lasted so
// long that somebody else must do something.
bool looksAgain(ThreadState& self, const void* object, const void* caller) {
    if (self.looksAt != object || self.seenAtTurn != scheduler().turns()) return false;
    if (++self.looks < kMostLooks) return true;
    self.looks = 0;
    Operation operation{"see something else", object, Operation::READS};
    operation.caller = caller;
    operation.ready = &othersHaveRun;
    operation.argument = &self;
    scheduler().point(operation);
    return true;
}

void beforeLoad(const void* object, const void* caller) {
    if (!scheduler().running()) return;
    ThreadState& self = scheduler().self();
    if (looksAgain(self, object, caller)) return;
    announce("load", object, caller, Operation::READS);
    self.looksAt = object;
    self.seenAtTurn = scheduler().turns();
    self.looks = 0;
}

void forgetLook() {
    if (scheduler().running()) scheduler().self().looksAt = nullptr;
}

template <class T>
T load(const volatile T* object, const void* caller) {
    beforeLoad(const_cast<const T*>(object), caller);
    return *object;
}

// Seen by the others before the thread goes on: there are points on both sides.
template <class T>
void store(volatile T* object, T value, const void* caller) {
    const void* const address = const_cast<const T*>(object);
    announce("store", address, caller);
    *object = value;
    forgetLook();
    announce("have stored", address, caller);
}

template <class T, class Change>
T change(volatile T* object, Change newValue, const void* caller) {
    const void* const address = const_cast<const T*>(object);
    announce("change", address, caller);
    const T old = *object;
    *object = newValue(old);
    forgetLook();
    announce("have changed", address, caller);
    return old;
}

template <class T>
bool exchangeIf(volatile T* object, T* expected, T value, const void* caller) {
    const T old = change(
        object, [&](T present) { return present == *expected ? value : present; }, caller);
    const bool equal = old == *expected;
    *expected = old;
    return equal;
}

}  // namespace

}  // namespace schedules

#define CALLER SCHEDULES_CALLER
#define FETCH(bits, type, name, expression)                                                    \
    extern "C" type __tsan_atomic##bits##_##name(volatile type* object, type operand, int);    \
    extern "C" type __tsan_atomic##bits##_##name(volatile type* object, type operand, int) {   \
        return schedules::change(                                                              \
            object, [operand](type old) { return static_cast<type>(expression); }, CALLER);    \
    }
#define EXCHANGE_IF(bits, type, name)                                                           \
    extern "C" int __tsan_atomic##bits##_##name(volatile type* object, type* expected,          \
                                                type value, int, int);                          \
    extern "C" int __tsan_atomic##bits##_##name(volatile type* object, type* expected,          \
                                                type value, int, int) {                         \
        return schedules::exchangeIf(object, expected, value, CALLER);                          \
    }
#define ATOMICS(bits, type)                                                                    \
    extern "C" type __tsan_atomic##bits##_load(const volatile type* object, int);              \
    extern "C" type __tsan_atomic##bits##_load(const volatile type* object, int) {             \
        return schedules::load(object, CALLER);                                                \
    }                                                                                          \
    extern "C" void __tsan_atomic##bits##_store(volatile type* object, type value, int);       \
    extern "C" void __tsan_atomic##bits##_store(volatile type* object, type value, int) {      \
        schedules::store(object, value, CALLER);                                               \
    }                                                                                          \
    FETCH(bits, type, exchange, (static_cast<void>(old), operand))                             \
    FETCH(bits, type, fetch_add, old + operand)                                                \
    FETCH(bits, type, fetch_sub, old - operand)                                                \
    FETCH(bits, type, fetch_and, old& operand)                                                 \
    FETCH(bits, type, fetch_or, old | operand)                                                 \
    FETCH(bits, type, fetch_xor, old ^ operand)                                                \
    EXCHANGE_IF(bits, type, compare_exchange_strong)                                           \
    EXCHANGE_IF(bits, type, compare_exchange_weak)

ATOMICS(8, std::uint8_t)
ATOMICS(16, std::uint16_t)
ATOMICS(32, std::uint32_t)
ATOMICS(64, std::uint64_t)

extern "C" {
void __tsan_atomic_thread_fence(int);
void __tsan_atomic_signal_fence(int);
void __tsan_atomic_thread_fence(int) {}
void __tsan_atomic_signal_fence(int) {}
}
