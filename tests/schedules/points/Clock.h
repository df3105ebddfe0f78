#pragma once

namespace schedules {

// Lets the run's clock, which otherwise moves by a microsecond a look, go on by so many seconds.
void advanceClock(unsigned seconds);

}  // namespace schedules
