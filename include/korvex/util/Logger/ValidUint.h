#pragma once

#include <korvex/Export.h>

KORVEX_NAMESPACE(korvex) {

// True if s consists of decimal digits without a leading zero, or is exactly "0": "0" and "42" are
// valid; "", "007", "4a" and "-1" are not. The number may be of any size. s must not be null. Safe
// from any thread.
KORVEX_EXPORT bool isValidUint(const char* s);

}  // KORVEX_NAMESPACE(korvex)
