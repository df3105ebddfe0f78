#pragma once

#include <string>
#include <vector>

#include "explorer/Scenario.h"

namespace schedules {

// Initialises logging from a configuration of these lines.
void configure(const std::string& lines);

// "" when both hold the same lines, whatever their order, else what does not fit.
std::string compare(const char* what, std::vector<std::string> found,
                    std::vector<std::string> expected);

// How often the text stands in the other.
unsigned count(const std::string& text, const std::string& in);

}  // namespace schedules
