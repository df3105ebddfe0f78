#include "points/Process.h"

#include <pthread.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>

#include "points/Wrap.h"

// Forks and exits. The handlers of pthread_atfork are kept here, so that a test can put one in
// front. A child runs to its end before its parent goes on.

SCHEDULES_REAL(pid_t, fork, ());
SCHEDULES_REAL(pid_t, waitpid, (pid_t, int*, int));
SCHEDULES_REAL(void, exit, (int));

namespace schedules {

namespace {

struct Handlers {
    void (*prepare)();
    void (*parent)();
    void (*child)();
};

constexpr unsigned kMostHandlers = 16;
Handlers handlers[kMostHandlers];
unsigned handlerCount = 0;

// The child that was forked last, which has ended.
pid_t lastChild = -1;
int lastStatus = 0;

void call(void (*handler)()) {
    if (handler != nullptr) handler();
}

void childMustHaveEndedWell() {
    if (WIFSIGNALED(lastStatus)) {
        scheduler().fail("the child of a fork was ended by signal %d, %s", WTERMSIG(lastStatus),
                         strsignal(WTERMSIG(lastStatus)));
    }
    if (WEXITSTATUS(lastStatus) == Scheduler::kFailed) _exit(Scheduler::kFailed);
}

}  // namespace

void atForkFromTheBeginning(void (*prepare)(), void (*parent)(), void (*child)()) {
    std::copy_backward(handlers, handlers + handlerCount, handlers + handlerCount + 1);
    handlers[0] = {prepare, parent, child};
    ++handlerCount;
}

}  // namespace schedules

using schedules::handlerCount;
using schedules::handlers;

SCHEDULES_WRAP(int, pthread_atfork, (void (*prepare)(), void (*parent)(), void (*child)())) {
    if (handlerCount == schedules::kMostHandlers) return ENOMEM;
    handlers[handlerCount++] = {prepare, parent, child};
    return 0;
}

SCHEDULES_WRAP(pid_t, fork, ()) {
    schedules::announce("fork", nullptr, SCHEDULES_CALLER);
    for (unsigned i = handlerCount; i > 0; --i)
        schedules::call(handlers[i - 1].prepare);
    schedules::announce("fork at last", nullptr, SCHEDULES_CALLER);
    const pid_t pid = __real_fork();
    if (pid == 0) {
        schedules::scheduler().becomeForkedChild();
        for (unsigned i = 0; i < handlerCount; ++i)
            schedules::call(handlers[i].child);
        return 0;
    }
    schedules::lastChild = pid;
    while (__real_waitpid(pid, &schedules::lastStatus, 0) < 0 && errno == EINTR) {
    }
    schedules::childMustHaveEndedWell();
    for (unsigned i = 0; i < handlerCount; ++i)
        schedules::call(handlers[i].parent);
    return pid;
}

SCHEDULES_WRAP(pid_t, waitpid, (pid_t pid, int* status, int options)) {
    if (pid != schedules::lastChild) return __real_waitpid(pid, status, options);
    if (status != nullptr) *status = schedules::lastStatus;
    return pid;
}

// The C library's own exit: handlers, destructors, and the flush of all streams, with points at
// whatever those do.
SCHEDULES_WRAP(void, exit, (int status)) {
    schedules::announce("exit", nullptr, SCHEDULES_CALLER);
    __real_exit(status);
    std::abort();
}
