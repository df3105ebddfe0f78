#include <cstdint>

#include "explorer/Races.h"
#include "points/Wrap.h"

// The building of function-local statics: one thread builds, the others wait for it.

namespace schedules {

namespace {

// The compiler's own guard: its first byte says that the object is there. The rest is ours.
struct Guard {
    std::uint8_t built;
    std::uint8_t building;

    static bool canGoOn(void* guard) { return static_cast<Guard*>(guard)->building == 0; }
};

}  // namespace

}  // namespace schedules

using schedules::Guard;

SCHEDULES_WRAP(int, __cxa_guard_acquire, (std::uint64_t * address)) {
    Guard& guard = *reinterpret_cast<Guard*>(address);
    schedules::Operation operation{"build a static", &guard};
    operation.caller = SCHEDULES_CALLER;
    operation.ready = &Guard::canGoOn;
    operation.argument = &guard;
    schedules::scheduler().point(operation);
    if (guard.built != 0) {
        schedules::Races::acquire(address);
        return 0;
    }
    guard.building = 1;
    return 1;
}

SCHEDULES_WRAP(void, __cxa_guard_release, (std::uint64_t * address)) {
    Guard& guard = *reinterpret_cast<Guard*>(address);
    schedules::announce("have built a static", &guard, SCHEDULES_CALLER);
    guard.building = 0;
    guard.built = 1;
    schedules::Races::release(address);
}

SCHEDULES_WRAP(void, __cxa_guard_abort, (std::uint64_t * address)) {
    Guard& guard = *reinterpret_cast<Guard*>(address);
    schedules::announce("have not built a static", &guard, SCHEDULES_CALLER);
    guard.building = 0;
}
