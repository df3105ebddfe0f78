#pragma once

#include <pthread.h>

#include <atomic>
#include <functional>
#include <initializer_list>
#include <memory>
#include <vector>

namespace schedules {

// Threads of a scenario that are no Thread of the library. They are joined at the end of the scope.
class Parallel {
  public:
    Parallel() = default;
    Parallel(std::initializer_list<std::function<void()>> bodies);
    Parallel(const Parallel&) = delete;
    Parallel& operator=(const Parallel&) = delete;
    ~Parallel() { join(); }

    void start(std::function<void()> body);
    void join();

  private:
    struct Started {
        pthread_t handle;
        std::unique_ptr<std::function<void()>> body;
    };
    std::vector<Started> _started;
};

// Waits until it is true.
void waitUntil(const std::atomic<bool>& flag);

// Waits until no other thread is left, detached ones included.
void waitForTheOthers();

// Runs `work` in a forked child, which leaves by _exit(), and waits for it.
void inForkedChild(const std::function<void()>& work);

}  // namespace schedules
