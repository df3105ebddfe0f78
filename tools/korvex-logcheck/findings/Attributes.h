#pragma once

#include <string>
#include <string_view>

#include "Configuration.h"
#include "Source.h"

// The last accepted line of an attribute, which is the one that counts; null without one.
const ConfigStatement* lastOf(const Appender& appender, std::string_view attribute);
// Whether any line sets it, accepted or not.
bool isSpokenOf(const Appender& appender, std::string_view attribute);
// Whether a line was surely to set it that the library refuses. That line is told, so what follows
// from it is not.
bool isMeantToBeSet(const Configuration& config, const Source& source, const Appender& appender,
                    const std::string& attribute);
