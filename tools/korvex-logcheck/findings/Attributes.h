#pragma once

#include <string_view>

#include "Configuration.h"

// The last accepted line of an attribute, which is the one that counts; null without one.
const ConfigStatement* lastOf(const Appender& appender, std::string_view attribute);
// Whether any line sets it, accepted or not.
bool isSpokenOf(const Appender& appender, std::string_view attribute);
