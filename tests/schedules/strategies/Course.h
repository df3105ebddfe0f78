#pragma once

#include "explorer/Schedule.h"
#include "explorer/Scheduler.h"

namespace schedules {

// Who goes on where a schedule does not say otherwise.
unsigned usualThread(const Choice& choice);

// Follows a schedule.
class Course : public Strategy {
  public:
    explicit Course(const Schedule& schedule) : _schedule(schedule) {}
    unsigned choose(const Choice& choice) override;

  private:
    const Schedule& _schedule;
    std::size_t _next = 0;
};

}  // namespace schedules
