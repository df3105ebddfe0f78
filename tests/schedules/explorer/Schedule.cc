#include "explorer/Schedule.h"

#include <sstream>

namespace schedules {

std::string toText(const Schedule& schedule) {
    std::string text;
    for (const Departure& d : schedule.departures) {
        if (!text.empty()) text += ' ';
        text += std::to_string(d.step) + ":" + std::to_string(d.thread);
    }
    return text;
}

Schedule parse(const std::string& text) {
    Schedule schedule;
    std::istringstream in(text);
    std::uint32_t step = 0;
    char colon = 0;
    unsigned thread = 0;
    while (in >> step >> colon >> thread)
        schedule.departures.push_back({step, static_cast<std::uint8_t>(thread)});
    return schedule;
}

}  // namespace schedules
