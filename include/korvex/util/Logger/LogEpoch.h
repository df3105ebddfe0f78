#pragma once

#include <korvex/Export.h>
#include <korvex/util/Timeval.h>

KORVEX_NAMESPACE(korvex) {

// The moment from which the layouts' %r and %R count: when logging was initialised, or the first
// call of this function if that came earlier. The same object every time, never destroyed; safe
// from any thread. Aborts when the clock fails, as Timeval does.
KORVEX_EXPORT const Timeval& epoch_timeval();

}  // KORVEX_NAMESPACE(korvex)
