#pragma once

#include <korvex/Export.h>

// A program may be built with -DDEBUG, or include a header that defines ERROR. The macros are set
// aside while the enumerators are declared, and restored afterwards. So such a program compiles as
// long as it does not name these levels itself. If it must, it uses #undef, or the numbers below.
#pragma push_macro("DEBUG")
#pragma push_macro("INFO")
#pragma push_macro("NOTICE")
#pragma push_macro("WARN")
#pragma push_macro("ERROR")
#pragma push_macro("CRIT")
#pragma push_macro("ALERT")
#pragma push_macro("FATAL")
#pragma push_macro("EMERG")
#undef DEBUG
#undef INFO
#undef NOTICE
#undef WARN
#undef ERROR
#undef CRIT
#undef ALERT
#undef FATAL
#undef EMERG

KORVEX_NAMESPACE(korvex) {

// The severity of a message. A channel accepts a message whose level is greater than or equal to
// the channel's minimum. Logger has no methods for NOTICE, ALERT and EMERG: they are for minimums
// only.
enum LogLevel : int {
    DEBUG = 0,
    INFO = 1,
    NOTICE = 2,
    WARN = 3,
    ERROR = 4,
    CRIT = 5,
    ALERT = 6,
    FATAL = 7,
    EMERG = 8
};

// The name of the level ("DEBUG" ... "EMERG"), or "???" for any other value. Stores its length in
// bytes in *len, which must not be null. The text is never freed. Never fails. Safe from any
// thread.
KORVEX_EXPORT const char* loglevel2str(unsigned long* len, LogLevel level);

}  // KORVEX_NAMESPACE(korvex)

#pragma pop_macro("DEBUG")
#pragma pop_macro("INFO")
#pragma pop_macro("NOTICE")
#pragma pop_macro("WARN")
#pragma pop_macro("ERROR")
#pragma pop_macro("CRIT")
#pragma pop_macro("ALERT")
#pragma pop_macro("FATAL")
#pragma pop_macro("EMERG")
