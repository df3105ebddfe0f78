#pragma once

// Includes all of logging.
#include <korvex/Export.h>
#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/Logger/LogChannel.h>
#include <korvex/util/Logger/LogEpoch.h>
#include <korvex/util/Logger/LogFormat.h>
#include <korvex/util/Logger/LogFormattedDate.h>
#include <korvex/util/Logger/LogLevel.h>
#include <korvex/util/Logger/LogMsgMetadata.h>
#include <korvex/util/Logger/ValidUint.h>
#include <korvex/util/Pathname.h>

#include <atomic>
#include <cstdarg>
#include <exception>
#include <string>

KORVEX_NAMESPACE(korvex) {

// A named logger, usually a static object of one source file. It writes to the channel of the same
// name. Cheap to build and to copy.
//
//     static Logger logger("net");
//     logger.warn("%s: lost after %d bytes: %m", peer, count);
//
// Works at any time. Before Logger::initialize, messages of level INFO and above go to standard
// error, without a layout. A logger whose constructor has not run yet (a static object of another
// source file) writes every message to standard error as "LEVEL - text". Static destructors, exit
// handlers and threads that outlive main may log too.
//
// A child of fork(2) may log, whatever the parent's other threads did at the fork. Do not fork in a
// signal handler that interrupted logging: the handler would wait for itself.
//
// The level methods never throw, leave errno as it was and may be called from any thread. Their
// printf forms take the conversions of printf(3), and %m for the text of errno at the call. (g++
// -Wpedantic warns that %m in a literal is not part of ISO C++; __extension__ before the call
// silences that warning.) If a conversion fails, the format itself is logged.
class Logger {
  public:
    // `name` is neither copied nor owned: it must outlive the logger and its copies. After
    // initialize(), the logger is bound at once to the channel of that name, or to the root channel
    // if there is no such channel yet. Before, initialize() binds it. Throws std::bad_alloc.
    explicit Logger(const char* name);
    // A copy has the same name and channel. A copy that is made before initialize() is not bound by
    // it: its messages go to standard error as "LEVEL - text" before, and to the root channel
    // afterwards.
    Logger(const Logger& other);
    Logger& operator=(const Logger& other);
    ~Logger();

    // Format as printf(3) does, with %m, if the channel accepts the level. No level ends the
    // process.
    void fatal(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));
    void crit(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));
    void error(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));
    void warn(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));
    void info(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));
    void debug(const char* fmt, ...) noexcept __attribute__((format(printf, 2, 3)));

    // The text as it stands; no % is interpreted.
    void fatal(const std::string& text) noexcept;
    void crit(const std::string& text) noexcept;
    void error(const std::string& text) noexcept;
    void warn(const std::string& text) noexcept;
    void info(const std::string& text) noexcept;
    void debug(const std::string& text) noexcept;

    // e.what() as it stands.
    void fatal(const std::exception& e) noexcept;
    void crit(const std::exception& e) noexcept;
    void error(const std::exception& e) noexcept;
    void warn(const std::exception& e) noexcept;
    void info(const std::exception& e) noexcept;
    void debug(const std::exception& e) noexcept;

    // Whether the channel accepts debug messages. If not, a caller can skip building a costly text.
    bool isDebugEnabled() const;

    // False if a message of that level is certain to be dropped. True if the channel accepts it, or
    // if the logger is not bound to a channel (before Logger::initialize). Costs two atomic loads.
    bool mayLog(LogLevel level) const {
        const LogChannel* const bound = _channel.load(std::memory_order_acquire);
        // With fewer hints g++ moves the usual case off the straight path.
        return !(__builtin_expect(bound != nullptr, true) &&
                 __builtin_expect(!bound->passes(level), true));
    }

    // The name given to the constructor.
    const char* getChannelName() const { return _channel_name; }

    // Formats into `out`, replacing its content, with the conversions of printf(3), and %m for the
    // text of error number `errnum` ("UNKNOWN ERROR" if strerror_r(3) has none). The text of %m
    // becomes part of the format. `out` may also be one of the arguments. If a conversion fails,
    // the result is the format itself. Leaves errno alone; throws std::bad_alloc.
    static void vformat(std::string& out, int errnum, const char* fmt, va_list ap)
        __attribute__((format(printf, 3, 0)));
    // The same with the current errno.
    static void format(std::string& out, const char* fmt, ...)
        __attribute__((format(printf, 2, 3)));
    // The same with the error number given.
    static void format(std::string& out, int errnum, const char* fmt, ...)
        __attribute__((format(printf, 3, 4)));

    // Marks logging as initialised and binds the loggers built so far. Once per process: a second
    // call is a failed assertion.
    static void initialize();

    // Reads the configuration file, sets up its appenders and channels, then does what initialize()
    // does. False if the file cannot be opened or ends inside an XML comment. Invalid lines are
    // reported on the channel "Logger" and skipped. korvexHome replaces "${KORVEX_HOME}" at the
    // beginning of file names. Once per process, on the main thread, before other threads log. The
    // file is not read again later.
    static bool initialize(const Pathname& conffile, const Pathname& korvexHome);

    // Sets the minimum of a channel, or of the root channel if `channel` is null, to the level with
    // that name in upper case. For any other word the result is false and the level stays the same.
    // Creates the channel if it does not exist, also for such a word. Only loggers that are built
    // afterwards use a new channel. Safe from any thread.
    static bool setChannelLevel(const char* channel, const std::string& levelstr);

  private:
    friend class EarlyLoggers;
    friend class LogFormat;

    LogChannel& channel() const;

    // What the printf forms do after the test of the level.
    void logFormatted(LogLevel level, const char* fmt, ...) noexcept;

    const char* _channel_name;
    unsigned long _channel_name_len;
    std::atomic<LogChannel*> _channel{nullptr};  // null: the root channel
    Logger* _next = nullptr;                     // in the list of loggers that wait
};

// With g++ the level is tested where the method is called, so a filtered message costs no function
// call: g++ can forward the arguments of a variadic function that it inlines. The library has the
// same bodies out of line, for pointers to members, for clang++, and for programs that were
// compiled before. (Levels are given as numbers because a program may have a macro DEBUG or ERROR.)
#if defined(__GNUC__) && !defined(__clang__) && !defined(KORVEX_LEVEL_METHODS_OUT_OF_LINE)
#define KORVEX_INLINE_LEVEL_METHOD(name, number)                                        \
    extern inline __attribute__((gnu_inline, always_inline, format(printf, 2, 3))) void \
    Logger::name(const char* fmt, ...) noexcept {                                       \
        constexpr LogLevel level = static_cast<LogLevel>(number);                       \
        if (mayLog(level)) logFormatted(level, fmt, __builtin_va_arg_pack());           \
    }
KORVEX_INLINE_LEVEL_METHOD(fatal, 7)
KORVEX_INLINE_LEVEL_METHOD(crit, 5)
KORVEX_INLINE_LEVEL_METHOD(error, 4)
KORVEX_INLINE_LEVEL_METHOD(warn, 3)
KORVEX_INLINE_LEVEL_METHOD(info, 1)
KORVEX_INLINE_LEVEL_METHOD(debug, 0)
#undef KORVEX_INLINE_LEVEL_METHOD
#endif

}  // KORVEX_NAMESPACE(korvex)

// The printf forms as macros. They do not evaluate the arguments of a message that is dropped:
//
//     KORVEX_DEBUG(logger, "state: %s", describeAll().c_str());
//
// `logger` is an expression of type Logger, evaluated once.
#define KORVEX_FATAL(logger, ...) KORVEX_LOG_AT(logger, fatal, 7, __VA_ARGS__)
#define KORVEX_CRIT(logger, ...) KORVEX_LOG_AT(logger, crit, 5, __VA_ARGS__)
#define KORVEX_ERROR(logger, ...) KORVEX_LOG_AT(logger, error, 4, __VA_ARGS__)
#define KORVEX_WARN(logger, ...) KORVEX_LOG_AT(logger, warn, 3, __VA_ARGS__)
#define KORVEX_INFO(logger, ...) KORVEX_LOG_AT(logger, info, 1, __VA_ARGS__)
#define KORVEX_DEBUG(logger, ...) KORVEX_LOG_AT(logger, debug, 0, __VA_ARGS__)

// An implementation detail of the macros above. Do not use it.
#define KORVEX_LOG_AT(logger, method, number, ...)                           \
    do {                                                                     \
        ::korvex::Logger& korvexLogger_ = (logger);                          \
        if (korvexLogger_.mayLog(static_cast<::korvex::LogLevel>(number))) { \
            korvexLogger_.method(__VA_ARGS__);                               \
        }                                                                    \
    } while (false)
