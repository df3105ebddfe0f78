#include "scenarios/Parallel.h"

#include <sys/wait.h>
#include <unistd.h>

#include "explorer/Scenario.h"
#include "explorer/Scheduler.h"

namespace schedules {

namespace {

void* call(void* body) {
    (*static_cast<std::function<void()>*>(body))();
    return nullptr;
}

}  // namespace

Parallel::Parallel(std::initializer_list<std::function<void()>> bodies) {
    for (const auto& body : bodies)
        start(body);
}

void Parallel::start(std::function<void()> body) {
    _started.push_back({pthread_t(), std::make_unique<std::function<void()>>(std::move(body))});
    Started& started = _started.back();
    require(pthread_create(&started.handle, nullptr, &call, started.body.get()) == 0, "no thread");
}

void Parallel::join() {
    for (const Started& started : _started)
        pthread_join(started.handle, nullptr);
    _started.clear();
}

void waitUntil(const std::atomic<bool>& flag) {
    Operation operation{"see it true", &flag, Operation::READS};
    operation.argument = const_cast<std::atomic<bool>*>(&flag);
    operation.ready = [](void* f) { return *static_cast<volatile const bool*>(f); };
    Scheduler::instance().point(operation);
    require(flag, "it is no longer true");
}

void waitForTheOthers() {
    Operation operation{"see the others end", nullptr};
    operation.ready = [](void*) { return Scheduler::instance().alone(); };
    Scheduler::instance().point(operation);
}

void inForkedChild(const std::function<void()>& work) {
    const pid_t pid = fork();
    if (pid == 0) {
        work();
        _exit(0);
    }
    int status = -1;
    require(pid > 0 && waitpid(pid, &status, 0) == pid && status == 0, "a child ended badly");
}

}  // namespace schedules
