#include "strategies/Priorities.h"

#include <algorithm>

namespace schedules {

Priorities::Priorities(std::uint64_t seed, unsigned depth, unsigned steps) : _state(seed) {
    for (unsigned i = 0; i < kMaxThreads; ++i)
        _priority[i] = depth + i;
    for (unsigned i = kMaxThreads - 1; i > 0; --i)
        std::swap(_priority[i], _priority[draw() % (i + 1)]);
    for (unsigned i = 1; i < depth; ++i)
        _changes.push_back(static_cast<unsigned>(draw() % std::max(steps, 1U)));
    std::sort(_changes.begin(), _changes.end());
}

// Sebastiano Vigna's splitmix64.
std::uint64_t Priorities::draw() {
    std::uint64_t z = _state += 0x9E3779B97F4A7C15U;
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9U;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBU;
    return z ^ (z >> 31);
}

unsigned Priorities::highest(ThreadMask among) const {
    unsigned best = kMaxThreads;
    for (unsigned thread = 0; thread < kMaxThreads; ++thread) {
        if ((among & bit(thread)) == 0) continue;
        if (best == kMaxThreads || _priority[thread] > _priority[best]) best = thread;
    }
    return best;
}

// At a change a wait may also end without a cause, or by its time.
unsigned Priorities::choose(const Choice& choice) {
    bool change = false;
    for (; _nextChange < _changes.size() && _changes[_nextChange] <= choice.step; ++_nextChange) {
        change = true;
        _priority[choice.current] = static_cast<unsigned>(_changes.size() - 1 - _nextChange);
    }
    const ThreadMask waiting = choice.couldTimeOut | choice.couldWake;
    if (change && waiting != 0 && draw() % 4 == 0) return highest(waiting);
    return highest(choice.ready != 0 ? choice.ready : choice.couldTimeOut);
}

}  // namespace schedules
