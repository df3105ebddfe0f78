#pragma once

namespace schedules {

// Registers handlers as if a static initialiser had done so before the library's own did.
void atForkFromTheBeginning(void (*prepare)(), void (*parent)(), void (*child)());

}  // namespace schedules
