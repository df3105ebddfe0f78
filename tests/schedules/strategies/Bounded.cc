#include "strategies/Bounded.h"

#include <algorithm>

#include "strategies/Course.h"

namespace schedules {

Bounded::Bounded(Runner& runner, const Scenario& scenario) : _runner(runner), _scenario(scenario) {
    _runner.forgetShared();
    startOver();
}

void Bounded::startOver() {
    _todo.assign(8, {});
    _todo[0].emplace_back();
}

// A run that finds one more shared object means that the earlier ones were not left in all the
// places where it matters; so all begins again.
Bounded::Result Bounded::explore(unsigned preemptions, unsigned long limit) {
    Result result;
    _most = preemptions;
    for (unsigned level = 0; level <= preemptions;) {
        if (_todo[level].empty()) {
            ++level;
            continue;
        }
        if (level == preemptions && result.schedules == limit) return result;
        const unsigned known = _runner.board().sharedObjects;
        if (!step(result, level)) return result;
        if (level == preemptions) ++result.schedules;
        if (_runner.board().sharedObjects == known) continue;
        startOver();
        result.schedules = 0;
        level = 0;
    }
    result.complete = true;
    return result;
}

bool Bounded::step(Result& result, unsigned level) {
    Schedule schedule = std::move(_todo[level].back());
    _todo[level].pop_back();
    Course course(schedule);
    ++_runs;
    result.failure = _runner.run(_scenario, course);
    if (result.failure.empty() && !wasFollowed(schedule)) {
        result.failure = "the run went another way than the one before it";
    }
    if (!result.failure.empty()) {
        result.schedule = std::move(schedule);
        return false;
    }
    addDepartures(schedule);
    return true;
}

// A run depends on nothing but its schedule, or nothing that is said here is true.
bool Bounded::wasFollowed(const Schedule& schedule) const {
    const Board& board = _runner.board();
    const Decision* decision = board.decision;
    for (const Departure& departure : schedule.departures) {
        const auto made = [&departure](const Decision& d) {
            return d.step == departure.step && d.chosen == departure.thread;
        };
        decision = std::find_if(decision, board.decision + board.decisions, made);
        if (decision == board.decision + board.decisions) return false;
    }
    return true;
}

// Whether it takes a preemption to let the thread go on there: one that was running could, or this
// one waits while others need not.
bool Bounded::isUnforced(const Decision& decision, unsigned thread) {
    if (decision.currentCouldGoOn) return true;
    if ((decision.ready & bit(thread)) != 0) return false;
    return decision.ready != 0 || (decision.couldTimeOut & bit(thread)) == 0;
}

void Bounded::addDepartures(const Schedule& from) {
    const Board& board = _runner.board();
    const long last = from.departures.empty() ? -1 : static_cast<long>(from.departures.back().step);
    for (unsigned i = 0; i < board.decisions; ++i) {
        const Decision& decision = board.decision[i];
        if (static_cast<long>(decision.step) <= last) continue;
        for (unsigned thread = 0; thread < kMaxThreads; ++thread) {
            const ThreadMask possible = decision.ready | decision.couldTimeOut | decision.couldWake;
            if (thread == decision.chosen || (possible & bit(thread)) == 0) continue;
            const unsigned cost = isUnforced(decision, thread) ? 1 : 0;
            if (from.preemptions + cost >= _todo.size()) continue;
            Schedule schedule = from;
            schedule.departures.push_back({decision.step, static_cast<std::uint8_t>(thread)});
            schedule.preemptions += cost;
            _todo[schedule.preemptions].push_back(std::move(schedule));
        }
    }
}

}  // namespace schedules
