#pragma once

#include <string>
#include <vector>

#include "export/LineShape.h"

// The lines of a shape as liblognorm's rules tell them.
struct RuleBase {
    std::vector<std::string> rules;  // the first that fits a line counts
    // The time comes in pieces time1, time2 ... with these texts between them.
    std::vector<std::string> timeJoints;
    std::vector<std::string> padded;  // fields with blanks at an end that are not theirs
};

// Throws Inexpressible.
RuleBase ruleBaseOf(const LineShape& shape);
