#pragma once

#include <cstdint>

namespace schedules {

// What a run tells the explorer, in memory that both see. A run is a process of its own, and so may
// be a child that it forks; each writes here while the others wait.

constexpr unsigned kMaxThreads = 6;
constexpr unsigned kMaxSteps = 20000;  // announced operations of one run
constexpr unsigned kMaxShared = 4096;

using ThreadMask = std::uint16_t;

constexpr ThreadMask bit(unsigned thread) {
    return static_cast<ThreadMask>(1U << thread);
}

// An operation that was about to be made when its thread was asked to wait for its turn.
struct Step {
    const char* what;    // "lock", "store", ...
    const void* object;  // what it is made on
    const void* caller;  // the instruction after the call
    std::uint8_t thread;
    bool inChild;  // of a fork
};

// A place where more than one thread could have gone on.
struct Decision {
    std::uint32_t step;       // its number in the run
    std::uint8_t current;     // the thread that had been running
    bool currentCouldGoOn;    // so that another choice is a preemption
    std::uint8_t chosen;      // who went on
    ThreadMask ready;         // who could have
    ThreadMask couldTimeOut;  // whose timed wait could have ended
    ThreadMask couldWake;     // who could have been woken without a cause
};

struct Board {
    unsigned steps;
    unsigned decisions;
    bool failed;
    char failure[1000];
    Step step[kMaxSteps];
    Decision decision[kMaxSteps];

    // Objects that two threads have used, one of them changing it. Kept from run to run: only there
    // it matters who comes first.
    unsigned sharedObjects;
    const void* shared[kMaxShared];

    void clear() {
        steps = decisions = 0;
        failed = false;
    }
};

}  // namespace schedules
