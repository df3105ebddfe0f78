#pragma once

#include <cstdint>
#include <vector>

#include "explorer/Scheduler.h"

namespace schedules {

// Gives each thread a priority by lot and lets the highest that can go on do so; at `depth` - 1
// steps, drawn from the first `steps`, the thread that is running falls below all others. Finds a
// defect that takes `depth` orders to show with a probability of at least 1 / (n * k^(depth - 1))
// for n threads and k steps (Burckhardt, Kothari, Musuvathi and Nagarakatte: A Randomized Scheduler
// with Probabilistic Guarantees of Finding Bugs, ASPLOS 2010). The same seed, depth and number of
// steps are the same schedule.
class Priorities : public Strategy {
  public:
    Priorities(std::uint64_t seed, unsigned depth, unsigned steps);
    unsigned choose(const Choice& choice) override;

  private:
    std::uint64_t draw();
    unsigned highest(ThreadMask among) const;

    std::uint64_t _state;
    unsigned _priority[kMaxThreads];
    std::vector<unsigned> _changes;  // steps, ascending
    std::size_t _nextChange = 0;
};

}  // namespace schedules
