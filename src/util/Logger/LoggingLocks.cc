#include "util/Logger/LoggingLocks.h"

#include <korvex/util/ThreadSafety.h>

#include "base/HeldLocks.h"
#include "base/ThreadText.h"
#include "util/Logger/AppenderOutput.h"
#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/ChannelRegistry.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/Epoch.h"
#include "util/Logger/InternalLogger.h"
#include "util/Logger/RootObjects.h"

inline namespace korvex {

// A function's static that another thread is just building would stay half built in the child.
// Asking for it waits until it is there. (The epoch and the internal logger have locks instead,
// because the moment at which they are built shows.)
void LoggingLocks::buildAll() {
    ThreadText::makeKey();
    internalLogger();
    emptyChannel();
    EarlyLoggers::mutex();
    ChannelRegistry::instance();
    appenders();
    rootAppender();
    rootChannel();
    epoch();
}

// In the one order in which they nest: the internal logger's building, the list of early loggers,
// the channels, then appenders and the epoch, under which only LibcLock is taken. (They stay held
// beyond the function, so the analysis has nothing to say.)
void LoggingLocks::takeAll() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    buildAll();
    internalLogger().mutex().NOLOG_lock();
    EarlyLoggers::mutex().NOLOG_lock();
    ChannelRegistry::instance().mutex.NOLOG_lock();
    rootAppender()._output->hold();
    for (const auto& [name, appender] : appenders())
        appender->_output->hold();
    epoch().mutex().NOLOG_lock();
    HeldLocks::setAll(true);
}

void LoggingLocks::freeAll() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    HeldLocks::setAll(false);
    epoch().mutex().NOLOG_unlock();
    for (const auto& [name, appender] : appenders())
        appender->_output->release();
    rootAppender()._output->release();
    ChannelRegistry::instance().mutex.NOLOG_unlock();
    EarlyLoggers::mutex().NOLOG_unlock();
    internalLogger().mutex().NOLOG_unlock();
}

}  // namespace korvex
