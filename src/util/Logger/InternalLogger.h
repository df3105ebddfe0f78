#pragma once

#include <korvex/util/Logger.h>

#include "util/Logger/FirstUse.h"

inline namespace korvex {

// What the logging system's own messages go through. Built at the first of them, because a channel
// "Logger" may be made until then.
FirstUse<Logger>& internalLogger();

// Stands in for its channel while it is unbound: the root channel's minimum is none of the logging
// system's business.
LogChannel& emptyChannel();

}  // namespace korvex
