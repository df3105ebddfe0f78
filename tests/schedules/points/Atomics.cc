#include <cstdint>

#include "explorer/Races.h"
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

// Memory orders as the compiler numbers them.
bool acquires(int order) {
    return order == __ATOMIC_ACQUIRE || order == __ATOMIC_CONSUME || order == __ATOMIC_ACQ_REL ||
           order == __ATOMIC_SEQ_CST;
}
bool releases(int order) {
    return order == __ATOMIC_RELEASE || order == __ATOMIC_ACQ_REL || order == __ATOMIC_SEQ_CST;
}

template <class T>
T load(const volatile T* object, int order, const void* caller) {
    const void* const address = const_cast<const T*>(object);
    beforeLoad(address, caller);
    if (acquires(order)) Races::acquire(address);
    return *object;
}

template <class T>
void store(volatile T* object, T value, int order, const void* caller) {
    const void* const address = const_cast<const T*>(object);
    announce("store", address, caller);
    *object = value;
    forgetLook();
    if (releases(order)) {
        Races::release(address);
    } else {
        Races::forget(address);
    }
}

template <class T, class Change>
T change(volatile T* object, Change newValue, int order, const void* caller) {
    const void* const address = const_cast<const T*>(object);
    announce("change", address, caller);
    const T old = *object;
    *object = newValue(old);
    forgetLook();
    if (acquires(order)) Races::acquire(address);
    if (releases(order)) Races::releaseMore(address);
    return old;
}

template <class T>
bool exchangeIf(volatile T* object, T* expected, T value, int order, const void* caller) {
    const T old = change(
        object, [&](T present) { return present == *expected ? value : present; }, order, caller);
    const bool equal = old == *expected;
    *expected = old;
    return equal;
}

}  // namespace

}  // namespace schedules

#define CALLER SCHEDULES_CALLER
#define FETCH(bits, type, name, expression)                                                        \
    extern "C" type __tsan_atomic##bits##_##name(volatile type* object, type operand, int order);  \
    extern "C" type __tsan_atomic##bits##_##name(volatile type* object, type operand, int order) { \
        return schedules::change(                                                                  \
            object, [operand](type old) { return static_cast<type>(expression); }, order, CALLER); \
    }
#define EXCHANGE_IF(bits, type, name)                                                              \
    extern "C" int __tsan_atomic##bits##_##name(volatile type* object, type* expected, type value, \
                                                int order, int);                                   \
    extern "C" int __tsan_atomic##bits##_##name(volatile type* object, type* expected, type value, \
                                                int order, int) {                                  \
        return schedules::exchangeIf(object, expected, value, order, CALLER);                      \
    }
// clang++'s one form of both.
#define EXCHANGE_IF_VALUE(bits, type)                                       \
    extern "C" type __tsan_atomic##bits##_compare_exchange_val(             \
        volatile type* object, type expected, type value, int order, int);  \
    extern "C" type __tsan_atomic##bits##_compare_exchange_val(             \
        volatile type* object, type expected, type value, int order, int) { \
        schedules::exchangeIf(object, &expected, value, order, CALLER);     \
        return expected;                                                    \
    }
#define ATOMICS(bits, type)                                                                     \
    extern "C" type __tsan_atomic##bits##_load(const volatile type* object, int order);         \
    extern "C" type __tsan_atomic##bits##_load(const volatile type* object, int order) {        \
        return schedules::load(object, order, CALLER);                                          \
    }                                                                                           \
    extern "C" void __tsan_atomic##bits##_store(volatile type* object, type value, int order);  \
    extern "C" void __tsan_atomic##bits##_store(volatile type* object, type value, int order) { \
        schedules::store(object, value, order, CALLER);                                         \
    }                                                                                           \
    FETCH(bits, type, exchange, (static_cast<void>(old), operand))                              \
    FETCH(bits, type, fetch_add, old + operand)                                                 \
    FETCH(bits, type, fetch_sub, old - operand)                                                 \
    FETCH(bits, type, fetch_and, old& operand)                                                  \
    FETCH(bits, type, fetch_or, old | operand)                                                  \
    FETCH(bits, type, fetch_xor, old ^ operand)                                                 \
    EXCHANGE_IF(bits, type, compare_exchange_strong)                                            \
    EXCHANGE_IF(bits, type, compare_exchange_weak)                                              \
    EXCHANGE_IF_VALUE(bits, type)

ATOMICS(8, std::uint8_t)
ATOMICS(16, std::uint16_t)
ATOMICS(32, std::uint32_t)
ATOMICS(64, std::uint64_t)

extern "C" {
void __tsan_atomic_thread_fence(int);
void __tsan_atomic_signal_fence(int);
// There is none in the library. One that came would have to be modelled.
void __tsan_atomic_thread_fence(int) {
    schedules::scheduler().fail("a thread fence, which the explorer does not know");
}
void __tsan_atomic_signal_fence(int) {}
}
