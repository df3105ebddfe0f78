#pragma once

#include <string>
#include <vector>

#include "findings/Code.h"

// The attributes that an appender has.
const std::vector<std::string>& attributeNames();

// The attribute that a name surely means, and the slip that it is: KEY_CASE, or KEY_OTHER_NAME for
// what other logging libraries call it. The name itself when it is one, or when nothing is sure.
struct MeantAttribute {
    std::string name;
    Code slip;
};
MeantAttribute meantAttribute(const std::string& name);
