#pragma once

#include <string>
#include <vector>

#include "explorer/Run.h"
#include "explorer/Schedule.h"

namespace schedules {

// Runs every schedule of a scenario that has no more than so many preemptions: a thread stopped
// where it could have gone on, or a wait that ends without a cause, or by its time while others can
// go on. Deepest departure first.
class Bounded {
  public:
    Bounded(Runner& runner, const Scenario& scenario);

    struct Result {
        unsigned long schedules = 0;  // that were run, each but once
        bool complete = false;
        std::string failure;  // of the last one, when it failed
        Schedule schedule;    // that one
    };
    // All those with exactly that many preemptions, those with fewer having been run; at most
    // `limit`.
    Result explore(unsigned preemptions, unsigned long limit);
    // How many have been run, those among them that had to be run again when it turned out that
    // one more object is shared.
    unsigned long runs() const { return _runs; }

  private:
    void startOver();
    bool step(Result& result, unsigned preemptions);
    bool wasFollowed(const Schedule& schedule) const;
    static bool isUnforced(const Decision& decision, unsigned thread);
    void addDepartures(const Schedule& from);

    Runner& _runner;
    const Scenario& _scenario;
    std::vector<std::vector<Schedule>> _todo;  // by preemptions
    unsigned _most = 0;
    unsigned long _runs = 0;
};

}  // namespace schedules
