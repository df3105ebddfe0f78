#pragma once

namespace schedules {

// Registers handlers as if a static initialiser of the program had done so before the library did.
void atForkFromTheBeginning(void (*prepare)(), void (*parent)(), void (*child)());

}  // namespace schedules
