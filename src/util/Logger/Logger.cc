// The functions below are not inline.
#define KORVEX_LEVEL_METHODS_OUT_OF_LINE
#include <korvex/util/Logger.h>

#include "base/ErrnoKeeper.h"
#include "platform/AtFork.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/LoggingLocks.h"
#include "util/Logger/RootObjects.h"

#include <cstring>

inline namespace korvex {

Logger::Logger(const char* name) : _channel_name(name), _channel_name_len(std::strlen(name)) {
    if (logger_initialized.load(std::memory_order_acquire)) {
        _channel.store(LogChannel::find(name, false), std::memory_order_release);
    } else {
        EarlyLoggers::add(*this);
    }
}

Logger::Logger(const Logger& other)
    : _channel_name(other._channel_name),
      _channel_name_len(other._channel_name_len),
      _channel(other._channel.load(std::memory_order_acquire)) {}

// The link stays: this object keeps its own place in the list.
Logger& Logger::operator=(const Logger& other) {
    if (this == &other) return *this;
    _channel_name = other._channel_name;
    _channel_name_len = other._channel_name_len;
    _channel.store(other._channel.load(std::memory_order_acquire), std::memory_order_release);
    return *this;
}

// A bound logger is not on the list. Its own state decides and not the global flag, because another
// thread may be emptying the list.
Logger::~Logger() {
    if (_channel.load(std::memory_order_acquire) == nullptr) EarlyLoggers::remove(*this);
}

LogChannel& Logger::channel() const {
    LogChannel* const bound = _channel.load(std::memory_order_acquire);
    return bound != nullptr ? *bound : rootChannel();
}

bool Logger::isDebugEnabled() const {
    return channel().passes(DEBUG);
}

namespace {

// This is here and not beside LoggingLocks, because the linker takes only those files from an
// archive that are needed. Every program that logs needs this one.
KORVEX_REGISTERS_LOGGING_LOCKS void keepLocksThroughForks() {
    pthread_atfork(&LoggingLocks::takeAll, &LoggingLocks::freeAll, &LoggingLocks::freeAll);
}

constexpr const char* percent_s = "%s";

}  // namespace

void Logger::logFormatted(LogLevel level, const char* fmt, ...) noexcept {
    va_list ap;
    va_start(ap, fmt);
    LogFormat::do_log(this, level, fmt, ap);
    va_end(ap);
}

// A variadic function cannot forward its arguments, so each level has three functions of its own,
// made by this macro. They test the level first.
#define KORVEX_LEVEL_METHODS(name, LEVEL)                 \
    void Logger::name(const char* fmt, ...) noexcept {    \
        if (!mayLog(LEVEL)) return;                       \
        va_list ap;                                       \
        va_start(ap, fmt);                                \
        LogFormat::do_log(this, LEVEL, fmt, ap);          \
        va_end(ap);                                       \
    }                                                     \
    void Logger::name(const std::string& text) noexcept { \
        if (!mayLog(LEVEL)) return;                       \
        LogFormat::do_log(this, LEVEL, text);             \
    }                                                     \
    void Logger::name(const std::exception& e) noexcept { \
        if (!mayLog(LEVEL)) return;                       \
        const ErrnoKeeper keeper;                         \
        logFormatted(LEVEL, percent_s, e.what());         \
    }

KORVEX_LEVEL_METHODS(fatal, FATAL)
KORVEX_LEVEL_METHODS(crit, CRIT)
KORVEX_LEVEL_METHODS(error, ERROR)
KORVEX_LEVEL_METHODS(warn, WARN)
KORVEX_LEVEL_METHODS(info, INFO)
KORVEX_LEVEL_METHODS(debug, DEBUG)

#undef KORVEX_LEVEL_METHODS

}  // namespace korvex
