#include <korvex/util/Logger.h>

#include "base/CancelShield.h"
#include "base/ErrnoKeeper.h"
#include "base/HeldLocks.h"
#include "base/PlainFormat.h"
#include "base/ThreadText.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/FallbackToStderr.h"
#include "util/Logger/InternalLogger.h"
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

}  // namespace

bool LogFormat::findTaker(const Logger& logger, LogLevel level, LogChannel*& taker) {
    taker = nullptr;
    // A signal handler that interrupted logging would wait for a lock of its own thread.
    if (HeldLocks::any()) return logger.channel().passes(level);
    if (check_for_unitialized_logger(&logger)) return true;
    taker = &logger.channel();
    return taker->passes(level);
}

void LogFormat::do_log(Logger* logger, LogLevel level, const std::string& text) noexcept {
    const ErrnoKeeper keeper;
    const CancelShield shield;
    LogChannel* channel = nullptr;
    if (!findTaker(*logger, level, channel)) return;
    deliver(channel, logger, level, text);
}

void LogFormat::do_log(Logger* logger, LogLevel level, const char* fmt, va_list ap) noexcept {
    const ErrnoKeeper keeper;
    const CancelShield shield;
    LogChannel* channel = nullptr;
    if (!findTaker(*logger, level, channel)) return;
    ThreadText text;
    if (formatInto(*text, keeper.saved(), fmt, ap)) deliver(channel, logger, level, *text);
}

void LogFormat::internal(const LogAppender* skip, LogLevel level, const char* fmt, ...) noexcept {
    const ErrnoKeeper keeper;
    const CancelShield shield;
    Logger& int_logger = internalLogger().get("Logger");
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
