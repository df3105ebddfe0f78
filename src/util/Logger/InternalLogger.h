#pragma once

#include <korvex/util/Logger.h>

#include "util/Logger/FirstUse.h"

inline namespace korvex {

// The logger of the logging system's own messages. It is built at the first of them, because the
// channel "Logger" may be made later than at start-up.
FirstUse<Logger>& internalLogger();

// The channel that it uses while it is unbound: the minimum of the root channel must not hide these
// messages.
LogChannel& emptyChannel();

}  // namespace korvex
