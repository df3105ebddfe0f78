#pragma once

#include <korvex/Export.h>
#include <korvex/util/Timeval.h>

KORVEX_NAMESPACE(korvex) {

// The moment from which %r and %R of the layouts count: when logging was initialised, or the first
// call of this function if that came earlier. Always the same object, which is never destroyed.
// Safe from any thread. Aborts if the clock fails, as Timeval does.
KORVEX_EXPORT const Timeval& epoch_timeval();

}  // KORVEX_NAMESPACE(korvex)
