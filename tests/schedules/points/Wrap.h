#pragma once

#include "explorer/Scheduler.h"

// How a call of the library reaches us: the linker's --wrap (CMakeLists.txt lists the names) sends
// it to __wrap_NAME, and __real_NAME is the C library's.
#define SCHEDULES_REAL(result, name, parameters) extern "C" result __real_##name parameters
#define SCHEDULES_WRAP(result, name, parameters) \
    extern "C" result __wrap_##name parameters;  \
    extern "C" result __wrap_##name parameters

// Where in the library the call stands.
#define SCHEDULES_CALLER __builtin_return_address(0)

namespace schedules {

inline Scheduler& scheduler() {
    return Scheduler::instance();
}

// An operation that can always be made at once.
inline void announce(const char* what, const void* object, const void* caller,
                     Operation::Access access = Operation::CHANGES) {
    Operation operation{what, object, access};
    operation.caller = caller;
    scheduler().point(operation);
}

}  // namespace schedules
