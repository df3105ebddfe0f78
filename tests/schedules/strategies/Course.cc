#include "strategies/Course.h"

namespace schedules {

unsigned usualThread(const Choice& choice) {
    if (choice.currentCouldGoOn) return choice.current;
    const ThreadMask mask = choice.ready != 0 ? choice.ready : choice.couldTimeOut;
    return static_cast<unsigned>(__builtin_ctz(mask));
}

unsigned Course::choose(const Choice& choice) {
    const auto& departures = _schedule.departures;
    while (_next < departures.size() && departures[_next].step < choice.step)
        ++_next;
    if (_next == departures.size() || departures[_next].step > choice.step)
        return usualThread(choice);
    const unsigned wanted = departures[_next].thread;
    const ThreadMask possible = choice.ready | choice.couldTimeOut | choice.couldWake;
    if ((possible & bit(wanted)) == 0)
        Scheduler::instance().fail("the schedule does not fit: thread %u cannot go on", wanted);
    return wanted;
}

}  // namespace schedules
