#include "util/Logger/RootObjects.h"

#include "base/NeverDestroyed.h"

#include <unistd.h>

inline namespace korvex {

const LogFormat& defaultFormat() {
    static NeverDestroyed<LogFormat> format("%m%n");
    return *format;
}

LogAppender& rootAppender() {
    static NeverDestroyed<LogAppender> appender(FileDescriptor(STDERR_FILENO), &defaultFormat());
    return *appender;
}

LogChannel& rootChannel() {
    static NeverDestroyed<LogChannel> channel;
    return *channel;
}

}  // namespace korvex
