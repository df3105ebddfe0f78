#pragma once

#include <functional>
#include <string>

namespace testsupport {

struct ChildResult {
    int status = -1;  // exit status; -1 when a signal ended the child
    int signal = 0;   // the signal that ended it, else 0
    std::string out;  // all of its standard output
    std::string err;  // all of its standard error
};

// Runs body in a forked child and waits for it. The child leaves through exit() with body's
// result, so that exit handlers and static destructors run. A child that hangs dies of SIGALRM
// after `seconds`. For whatever a process can do only once.
ChildResult runInChild(const std::function<int()>& body, unsigned seconds = 60);

// Ends a child that was forked while other threads ran, as _exit(2) does. The thread sanitizer,
// which reports nothing else in such a child, would take those threads for ones that it leaks.
[[noreturn]] void endForkedChild(int status);

// What the calling child has written to its standard error so far.
std::string ownStderr();

}  // namespace testsupport
