#pragma once

namespace schedules {

// Runs the clean-up of the ending thread's values, as glibc does after a thread's main function.
void cleanUpThreadSpecific();

}  // namespace schedules
