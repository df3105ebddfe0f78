#include <korvex/util/Logger.h>

#include "base/ErrnoKeeper.h"
#include "base/NeverDestroyed.h"
#include "base/PlainFormat.h"
#include "base/ThreadText.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/FallbackToStderr.h"
#include "util/Logger/Reporting.h"

inline namespace korvex {

namespace {

void lastResort(LogLevel level, const std::string& text) noexcept {
    try {
        fallback_to_stderr(level, text);
    } catch (...) {  // no memory even for one line: there is nowhere left to say so
    }
}

// To the channel, or to standard error when there is none or it throws.
void deliver(LogChannel* channel, const Logger* logger, LogLevel level,
             const std::string& text) noexcept {
    if (channel != nullptr) {
        try {
            channel->write(LogMsgMetadata(logger, level), text);
            return;
        } catch (...) {  // the line is not lost: it goes to standard error below
        }
    }
    lastResort(level, text);
}

// Into an empty text, which is no argument.
bool formatInto(std::string& text, int errnum, const char* fmt, va_list ap) noexcept
    __attribute__((format(printf, 3, 0)));

bool formatInto(std::string& text, int errnum, const char* fmt, va_list ap) noexcept {
    try {
        if (!formatPlain(text, fmt, ap)) Logger::vformat(text, errnum, fmt, ap);
        return true;
    } catch (...) {
        return false;
    }
}

Logger& internalLogger() {
    static NeverDestroyed<Logger> int_logger("Logger");
    return *int_logger;
}

// Stands in while the internal logger is unbound: the root channel's minimum is none of the
// logging system's business.
LogChannel& emptyChannel() {
    static NeverDestroyed<LogChannel> empty_channel;
    return *empty_channel;
}

}  // namespace

void LogFormat::do_log(Logger* logger, LogLevel level, const std::string& text) noexcept {
    const ErrnoKeeper keeper;
    LogChannel* channel = nullptr;
    if (!check_for_unitialized_logger(logger)) {
        channel = &logger->channel();
        if (!channel->passes(level)) return;
    }
    deliver(channel, logger, level, text);
}

void LogFormat::do_log(Logger* logger, LogLevel level, const char* fmt, va_list ap) noexcept {
    const ErrnoKeeper keeper;
    LogChannel* channel = nullptr;
    if (!check_for_unitialized_logger(logger)) {
        channel = &logger->channel();
        if (!channel->passes(level)) return;
    }
    ThreadText text;
    if (formatInto(*text, keeper.saved(), fmt, ap)) deliver(channel, logger, level, *text);
}

void LogFormat::internal(const LogAppender* skip, LogLevel level, const char* fmt, ...) noexcept {
    const ErrnoKeeper keeper;
    Logger& int_logger = internalLogger();
    LogChannel* const bound = int_logger._channel.load(std::memory_order_acquire);
    LogChannel& channel = bound != nullptr ? *bound : emptyChannel();
    if (!channel.passes(level)) return;
    va_list ap;
    va_start(ap, fmt);
    ThreadText text;
    const bool formatted = formatInto(*text, keeper.saved(), fmt, ap);
    va_end(ap);
    if (!formatted) return;
    const ReportingMark mark(skip);
    try {
        if (channel.write(LogMsgMetadata(&int_logger, level), *text, skip)) return;
    } catch (...) {  // as in deliver()
    }
    lastResort(level, *text);
}

}  // namespace korvex
