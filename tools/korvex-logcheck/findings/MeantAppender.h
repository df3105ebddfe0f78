#pragma once

#include <string>

#include "Configuration.h"

// The appender that an appender's name surely means: nobody uses this one, the other one is used
// and spelt nearly so, and what is said of the two does not overlap. Empty when nothing is sure.
std::string meantAppender(const Configuration& config, const Appender& appender);
