#include "crash-states/Effort.h"

#include <cstdio>
#include <cstdlib>
#include <string_view>

namespace crashstates {

bool isThorough() {
    const char* const value = std::getenv("KORVEX_CRASH_STATES");
    return value != nullptr && std::string_view(value) == "all";
}

void printStates(const std::string& subject, const History& history, const CrashStates& states,
                 const std::string& result) {
    std::printf("[  states ] %s | %zu | %zu | %s%s\n", subject.c_str(), history.events.size(),
                states.all().size(), result.c_str(),
                states.complete() ? "" : " (not all: bounded)");
}

}  // namespace crashstates
