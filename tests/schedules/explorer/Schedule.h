#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace schedules {

// A schedule is told by where it leaves the usual course, in which a thread runs on until it must
// wait, and then the lowest one goes on that can.
struct Departure {
    std::uint32_t step;
    std::uint8_t thread;
};

struct Schedule {
    std::vector<Departure> departures;  // by step
    unsigned preemptions = 0;
};

// "12:1 40:0", which parse() reads again.
std::string toText(const Schedule& schedule);
Schedule parse(const std::string& text);

}  // namespace schedules
