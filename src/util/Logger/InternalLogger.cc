#include "util/Logger/InternalLogger.h"

#include "base/NeverDestroyed.h"

inline namespace korvex {

FirstUse<Logger>& internalLogger() {
    static NeverDestroyed<FirstUse<Logger>> int_logger;
    return *int_logger;
}

LogChannel& emptyChannel() {
    static NeverDestroyed<LogChannel> empty_channel;
    return *empty_channel;
}

}  // namespace korvex
