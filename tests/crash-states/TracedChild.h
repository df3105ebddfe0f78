#pragma once

#include <sys/types.h>

#include <functional>
#include <string>

namespace crashstates {

// A system call that came to its end without an error.
struct SystemCall {
    pid_t process;  // which made it, or one of its threads
    long number;    // SYS_write and the like
    unsigned long long arguments[6];
    long long result;

    int intArgument(unsigned i) const { return static_cast<int>(arguments[i]); }
    // The text in the process's memory that an argument points to.
    std::string textArgument(unsigned i) const;
};

// Runs body in a child, which ends with its result as exit status or becomes another program, and
// shows each system call as soon as it is done, while the child waits. The child's exit status;
// throws std::runtime_error when it ends in another way or cannot be traced.
int traceCalls(const std::function<int()>& body,
               const std::function<void(const SystemCall&)>& seen);

}  // namespace crashstates
