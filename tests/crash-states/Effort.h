#pragma once

#include <string>

#include "crash-states/CrashStates.h"
#include "crash-states/History.h"

namespace crashstates {

// Whether KORVEX_CRASH_STATES asks for all that can be looked at, not only for some seconds' worth.
bool isThorough();

// Prints a row of the table that ./dev crash-states makes.
void printStates(const std::string& subject, const History& history, const CrashStates& states,
                 const std::string& result);

}  // namespace crashstates
