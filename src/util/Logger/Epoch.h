#pragma once

#include <korvex/util/Timeval.h>

#include "util/Logger/FirstUse.h"

inline namespace korvex {

// The logging epoch, which is the moment of its first use.
FirstUse<CurrentTimeval>& epoch();

}  // namespace korvex
