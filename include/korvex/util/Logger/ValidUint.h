#pragma once

#include <korvex/Export.h>

KORVEX_NAMESPACE(korvex) {

// True when s is a non-empty run of decimal digits without a leading zero, or exactly "0": "0" and
// "42" are valid; "", "007", "4a" and "-1" are not. The magnitude is not looked at. s must not be
// null. Safe from any thread.
KORVEX_EXPORT bool isValidUint(const char* s);

}  // KORVEX_NAMESPACE(korvex)
