#pragma once

#include <string>

#include "findings/Findings.h"

// The appender that an appender's name surely means: nobody uses this one, it has no file, and the
// other one, which is used, is spelt nearly so. Empty when nothing is sure.
std::string meantAppender(const Reading& reading, const Appender& appender);
