#include <cerrno>
#include <cstring>

#include "explorer/Races.h"
#include "points/ThreadSpecific.h"
#include "points/Wrap.h"

SCHEDULES_REAL(int, pthread_create, (pthread_t*, const pthread_attr_t*, void* (*)(void*), void*));
SCHEDULES_REAL(int, pthread_join, (pthread_t, void**));
SCHEDULES_REAL(int, pthread_detach, (pthread_t));

namespace schedules {

namespace {

// Each thread has a stack of its own, which no later one gets: so addresses are the same in every
// run, and an object on it is never taken for one of an earlier thread.
constexpr std::size_t kStack = 256 << 10;
alignas(4096) char stacks[kMaxThreads][kStack];

int startThread(ThreadState& thread, void* (*main)(void*)) {
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    pthread_attr_setstack(&attributes, stacks[thread.number], kStack);
    const int error = __real_pthread_create(&thread.handle, &attributes, main, &thread);
    pthread_attr_destroy(&attributes);
    return error;
}

void* threadMain(void* argument) {
    ThreadState& self = *static_cast<ThreadState*>(argument);
    scheduler().beginThread(self);
    self.result = self.start(self.argument);
    cleanUpThreadSpecific();
    scheduler().endThread();
    return nullptr;
}

bool hasEnded(void* thread) {
    return static_cast<ThreadState*>(thread)->life == ThreadState::ENDED;
}

ThreadState& known(pthread_t handle, const char* what) {
    ThreadState* const thread = scheduler().find(handle);
    if (thread == nullptr) scheduler().fail("%s a thread that is none", what);
    return *thread;
}

}  // namespace

}  // namespace schedules

using schedules::scheduler;
using schedules::ThreadState;

// The new thread may run before its creator has been told its handle.
SCHEDULES_WRAP(int, pthread_create,
               (pthread_t * handle, const pthread_attr_t*, void* (*start)(void*), void* argument)) {
    schedules::announce("create a thread", handle, SCHEDULES_CALLER);
    ThreadState* const created = scheduler().add();
    if (created == nullptr) return EAGAIN;
    created->start = start;
    created->argument = argument;
    schedules::Races::beginThread(created->number, scheduler().self().number);
    const int error = schedules::startThread(*created, &schedules::threadMain);
    if (error != 0) scheduler().fail("no thread: %s", std::strerror(error));
    schedules::announce("have created a thread", handle, SCHEDULES_CALLER);
    *handle = created->handle;
    return 0;
}

SCHEDULES_WRAP(int, pthread_join, (pthread_t handle, void** result)) {
    ThreadState& thread = schedules::known(handle, "join");
    schedules::Operation operation{"join", &thread};
    operation.caller = SCHEDULES_CALLER;
    operation.ready = &schedules::hasEnded;
    operation.argument = &thread;
    scheduler().point(operation);
    __real_pthread_join(handle, nullptr);
    thread.joined = true;
    schedules::Races::joinThread(thread.number);
    if (result != nullptr) *result = thread.result;
    return 0;
}

SCHEDULES_WRAP(int, pthread_detach, (pthread_t handle)) {
    ThreadState& thread = schedules::known(handle, "detach");
    schedules::announce("detach", &thread, SCHEDULES_CALLER);
    thread.joined = true;
    return __real_pthread_detach(handle);
}
