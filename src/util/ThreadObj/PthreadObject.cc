#include <korvex/util/Thread.h>
#include <korvex/util/ThreadObj.h>

#include "base/NeverDestroyed.h"
#include "util/ThreadObj/CheckThreadErrors.h"
#include "util/ThreadObj/ThreadLogger.h"

#include <string>

inline namespace korvex {

std::atomic<bool> checkThreadErrors{true};

Logger& threadLogger() {
    static NeverDestroyed<Logger> logger("Thread");
    return *logger;
}

namespace {

// Creates the logger at start-up, so that it is bound when logging is initialised.
[[maybe_unused]] const Logger& builtAtStartUp = threadLogger();

}  // namespace

void PthreadObject::checkPtRes(const char* funcname, int rval) {
    if (rval == 0 || !checkThreadErrors.load(std::memory_order_relaxed)) return;
    std::string message;
    __extension__ Logger::format(message, rval, "%s: about to throw a PthreadException: %s: %m",
                                 Thread::currentName(), funcname);
    threadLogger().warn(message);
    throw PthreadException(message.c_str());
}

PthreadToken PthreadToken::self() {
    PthreadToken token;
    token._token = pthread_self();
    return token;
}

bool PthreadToken::operator==(const PthreadToken& other) const {
    return pthread_equal(_token, other._token) != 0;
}

}  // namespace korvex
