#include "util/Logger/LoggingLocks.h"

#include <korvex/util/ThreadSafety.h>

#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/ChannelRegistry.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/RootObjects.h"

#include <pthread.h>

inline namespace korvex {

void LoggingLocks::keepThroughForks() {
    [[maybe_unused]] static const int arranged = pthread_atfork(&takeAll, &freeAll, &freeAll);
}

// In the one order in which they nest: the list of early loggers, the channels, then appenders,
// which hold nothing else while they write. (They stay held beyond the function, so the analysis
// has nothing to say.)
void LoggingLocks::takeAll() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    EarlyLoggers::mutex().NOLOG_lock();
    ChannelRegistry::instance().mutex.NOLOG_lock();
    rootAppender()._mutex.NOLOG_lock();
    for (const auto& [name, appender] : appenders())
        appender->_mutex.NOLOG_lock();
}

void LoggingLocks::freeAll() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    for (const auto& [name, appender] : appenders())
        appender->_mutex.NOLOG_unlock();
    rootAppender()._mutex.NOLOG_unlock();
    ChannelRegistry::instance().mutex.NOLOG_unlock();
    EarlyLoggers::mutex().NOLOG_unlock();
}

}  // namespace korvex
