#include <korvex/util/Logger.h>

#include <memory>

#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// Loggers that are built, used and destroyed while initialize() binds them.

namespace schedules {

namespace {

void destroyed() {
    auto early = std::make_unique<Logger>("early");
    Parallel threads{[&] { early.reset(); }};
    Logger::initialize();
    threads.join();
}

void listed() {
    auto first = std::make_unique<Logger>("first");
    auto second = std::make_unique<Logger>("second");
    const Logger third("third");
    Parallel threads{[&] {
                         second.reset();
                         const Logger late("late");
                     },
                     [&] { first.reset(); }};
    Logger::initialize();
    threads.join();
}

void used() {
    Logger early("early");
    Parallel threads{[&] { early.info("one"); },
                     [&] {
                         Logger own("own");
                         own.info("two");
                         own.debug("never");
                     }};
    Logger::initialize();
    threads.join();
    early.info("three");
}

std::string checkUsed(const Remains& remains) {
    return compare("standard error", Remains::lines(remains.err), {"one", "two", "three"});
}

// The channel to which it is bound is made by a third thread.
void boundToNewChannel() {
    Logger early("net");
    Parallel threads{[&] { early.info(std::string("one")); },
                     [] { Logger::setChannelLevel("net", "DEBUG"); }};
    Logger::initialize();
    threads.join();
}

std::string checkOne(const Remains& remains) {
    return compare("standard error", Remains::lines(remains.err), {"one"});
}

const Register registered{
    {"early-logger-bound", &boundToNewChannel, &checkOne},
    {"early-logger-destroyed", &destroyed},
    {"early-loggers-listed", &listed},
    {"early-loggers-used", &used, &checkUsed},
};

}  // namespace

}  // namespace schedules
