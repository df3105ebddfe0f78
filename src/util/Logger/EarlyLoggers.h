#pragma once

#include <korvex/util/Logger.h>
#include <korvex/util/ThreadObj.h>

#include <atomic>

inline namespace korvex {

// Whether Logger::initialize has run. Constant-initialised, so that any static initialiser may ask.
extern std::atomic<bool> logger_initialized;

// The loggers built before initialisation. Threads may start, build loggers and log early, so the
// list has a lock; nothing here is called for a bound logger.
class KORVEX_HIDDEN EarlyLoggers {
  public:
    // Puts the logger on the list, or binds it if logging was initialised meanwhile.
    static void add(Logger& logger);
    // Takes it off the list, if it is there.
    static void remove(Logger& logger);
    // True if logging is not initialised and the logger is not on the list, so not constructed yet.
    static bool isUnusable(const Logger& logger);
    // Marks logging as initialised and binds every logger on the list, newest first.
    static void initialize();

    // Guards the list.
    static Mutex& mutex();

  private:
    static void bind(Logger& logger);

    static Logger* uninitialized_loggers KORVEX_GUARDED_BY(mutex());
};

}  // namespace korvex
