#include "util/Logger/EarlyLoggers.h"

#include "base/Assert.h"
#include "base/NeverDestroyed.h"
#include "util/Logger/LoggingLock.h"

inline namespace korvex {

std::atomic<bool> logger_initialized{false};
Logger* EarlyLoggers::uninitialized_loggers = nullptr;

Mutex& EarlyLoggers::mutex() {
    static NeverDestroyed<Mutex> instance;
    return *instance;
}

void EarlyLoggers::bind(Logger& logger) {
    logger._channel.store(LogChannel::find(logger._channel_name, false), std::memory_order_release);
}

void EarlyLoggers::add(Logger& logger) {
    const LoggingLock lock(mutex());
    if (logger_initialized) {
        bind(logger);
        return;
    }
    logger._next = uninitialized_loggers;
    uninitialized_loggers = &logger;
}

void EarlyLoggers::remove(Logger& logger) {
    const LoggingLock lock(mutex());
    for (Logger** link = &uninitialized_loggers; *link != nullptr; link = &(*link)->_next) {
        if (*link == &logger) {
            *link = logger._next;
            return;
        }
    }
}

bool EarlyLoggers::isUnusable(const Logger& logger) {
    const LoggingLock lock(mutex());
    if (logger_initialized) return false;  // it has been emptied meanwhile
    for (const Logger* l = uninitialized_loggers; l != nullptr; l = l->_next) {
        if (l == &logger) return false;
    }
    return true;
}

void EarlyLoggers::initialize() {
    const LoggingLock lock(mutex());
    KORVEX_ASSERT(!logger_initialized);
    epoch_timeval();
    logger_initialized = true;
    // The owner of a logger may destroy it as soon as it is bound. So it is taken off the list
    // first, and not used after it was bound.
    while (Logger* const logger = uninitialized_loggers) {
        uninitialized_loggers = logger->_next;
        logger->_next = nullptr;
        bind(*logger);
    }
}

bool LogFormat::check_for_unitialized_logger(const Logger* logger) {
    if (logger_initialized.load(std::memory_order_acquire)) return false;
    return EarlyLoggers::isUnusable(*logger);
}

}  // namespace korvex
