#include <korvex/util/Logger.h>

#include <pthread.h>

#include <cerrno>
#include <string>

#include "points/Process.h"
#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"
#include "scenarios/Workers.h"

// Forks while other threads log. The child has none of them, and everything as they left it.

namespace schedules {

namespace {

constexpr const char* kDated =
    "rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n"
    "appender.A.layout.ConversionPattern=%d{%Y} %m%n\n";

void withDates() {
    configure(kDated);
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("parent")); }};
    inForkedChild([&] { logger.info(std::string("child")); });
    threads.join();
}

std::string checkDates(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"2026 parent", "2026 child"});
}

void printf() {
    configure("rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n");
    Logger logger("test");
    Parallel threads{[&] { logger.info("%s", "parent"); }};
    inForkedChild([&] { logger.info("%s", "child"); });
    threads.join();
}

std::string checkPrintf(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"parent", "child"});
}

// Errors' texts in the words of the user's language.
void errorTexts() {
    configure(
        "rootCategory=INFO,A\nappender.A=File\n"
        "appender.A.fileName=log\n");
    Logger logger("test");
    const auto log = [&] {
        errno = ENOENT;
        __extension__ logger.info("%m");
    };
    Parallel threads{log};
    inForkedChild(log);
    threads.join();
}

std::string checkErrorTexts(const Remains& remains) {
    const std::string line = "No such file or directory";
    return compare("the log", Remains::lines(remains.file("log")), {line, line});
}

// The first failing line of each.
void failing() {
    configure("rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=/dev/full\n");
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("parent")); }};
    inForkedChild([&] { logger.info(std::string("child")); });
    threads.join();
}

std::string checkFailing(const Remains& remains) {
    const std::string line = "CRIT - Error writing to \"/dev/full\": No space left on device";
    return compare("standard error", Remains::lines(remains.err), {line, line});
}

// Before anything is configured, a failing line takes other ways.
void failingEarly() {
    require(LogAppender::find("A", true)->setAttribute("fileName", "/dev/full", Pathname()),
            "the file's name is refused");
    LogChannel::find("", false)->setConfig("INFO,A");
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("parent")); }};
    inForkedChild([&] { logger.info(std::string("child")); });
    threads.join();
}

std::string checkFailingEarly(const Remains& remains) {
    const std::string line = "Error writing to \"/dev/full\": No space left on device";
    return compare("standard error", Remains::lines(remains.err), {line, line});
}

// All that a line can hold, for the first time in the process.
void firstLines() {
    require(LogAppender::find("A", true)->setAttribute("fileName", "log", Pathname()) &&
                LogAppender::find("A", true)->setAttribute("layout.ConversionPattern", "%R %m%n",
                                                           Pathname()),
            "an attribute is refused");
    LogChannel::find("", false)->setConfig("INFO,A");
    Parallel threads{[&] {
        Logger logger("parent");
        logger.info("%s", "parent");
    }};
    inForkedChild([&] {
        Logger logger("child");
        logger.info("%s", "child");
    });
    threads.join();
}

std::string checkFirstLines(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"0 parent", "0 child"});
}

void childUsesRegistries() {
    configure("rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n");
    Parallel threads{[&] {
        Logger::setChannelLevel("one", "DEBUG");
        Logger one("one");
        one.debug("parent");
    }};
    inForkedChild([&] {
        Logger::setChannelLevel("one", "DEBUG");
        Logger one("one");
        one.debug("child");
    });
    threads.join();
}

// Taken in one order there, in the same one here.
void besideInitialize() {
    Logger logger("test");
    Parallel threads{[] { Logger::initialize(); }};
    inForkedChild([&] { logger.info(std::string("child")); });
    threads.join();
    logger.info(std::string("parent"));
}

std::string checkStderr(const Remains& remains) {
    return compare("standard error", Remains::lines(remains.err), {"parent", "child"});
}

// Each line makes the file a backup; the child goes on where its parent was.
void rotating() {
    configure(
        "rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n"
        "appender.A.maxFileSize=2\nappender.A.maxBackupIndex=5\n");
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("parent")); }};
    inForkedChild([&] { logger.info(std::string("child")); });
    threads.join();
}

std::string checkRotating(const Remains& remains) {
    std::string all;
    for (const char* name : {"log", "log.1", "log.2", "log.3"})
        all += remains.file(name);
    return compare("the log with its backups", Remains::lines(all), {"parent", "child"});
}

// While others are writing to the open file. The child's line passes the limit.
void besideWriters() {
    configure(
        "rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n"
        "appender.A.maxFileSize=20\nappender.A.maxBackupIndex=5\n");
    Logger logger("test");
    logger.info(std::string("first"));
    Parallel threads{[&] { logger.info(std::string("parent")); }};
    inForkedChild([&] { logger.info(std::string("child's one")); });
    threads.join();
}

std::string checkBesideWriters(const Remains& remains) {
    return compare("the log with its backup",
                   Remains::lines(remains.file("log") + remains.file("log.1")),
                   {"first", "parent", "child's one"});
}

// A handler that a static initialiser of the process registered before the library's own.
Logger* handlersLogger = nullptr;

void handlerLogs() {
    configure(
        "rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n"
        "appender.A.layout.ConversionPattern=%d{%Y} %m%n\n");
    Logger logger("test");
    handlersLogger = &logger;
    atForkFromTheBeginning([] { handlersLogger->info("prepare"); },
                           [] { handlersLogger->info("parent"); },
                           [] { handlersLogger->info("child"); });
    Parallel threads{[&] { logger.info(std::string("other")); }};
    inForkedChild([] {});
    threads.join();
}

std::string checkHandler(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")),
                   {"2026 prepare", "2026 parent", "2026 child", "2026 other"});
}

// One that was registered later takes a lock of its own under which other threads log.
Mutex& handlersLock() {
    static Mutex& mutex = *new Mutex;
    return mutex;
}

void handlerLocks() {
    configure("rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n");
    Logger logger("test");
    handlersLogger = &logger;
    pthread_atfork(
        [] {
            handlersLock().NOLOG_lock();
            handlersLogger->info(std::string("prepare"));
        },
        [] { handlersLock().NOLOG_unlock(); },
        [] {
            handlersLogger->info(std::string("child"));
            handlersLock().NOLOG_unlock();
        });
    Parallel threads{[&] {
        const ScopedMutex lock(handlersLock());
        logger.info(std::string("other"));
    }};
    inForkedChild([&] { const ScopedMutex lock(handlersLock()); });
    threads.join();
}

std::string checkHandlerLocks(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"prepare", "child", "other"});
}

// The child may build threads of its own, whatever those of its parent were doing.
void besideThreads() {
    const Thread mainThread;
    const auto live = [] {
        Worker worker("worker", [] {});
        worker.go();
        worker.join();
    };
    Parallel threads{live};
    inForkedChild(live);
    threads.join();
}

const Register registered{
    {"fork-beside-threads", &besideThreads},
    {"fork-handler-locks", &handlerLocks, &checkHandlerLocks},
    {"fork-with-dates", &withDates, &checkDates},
    {"fork-printf", &printf, &checkPrintf},
    {"fork-beside-initialize", &besideInitialize, &checkStderr},
    {"fork-rotating", &rotating, &checkRotating},
    {"fork-beside-writers", &besideWriters, &checkBesideWriters},
    {"fork-error-texts", &errorTexts, &checkErrorTexts},
    {"fork-failing", &failing, &checkFailing},
    {"fork-failing-early", &failingEarly, &checkFailingEarly},
    {"fork-first-lines", &firstLines, &checkFirstLines},
    {"fork-registries", &childUsesRegistries, &checkPrintf},
    {"fork-handler-logs", &handlerLogs, &checkHandler},
};

}  // namespace

}  // namespace schedules
