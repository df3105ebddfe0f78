#include <korvex/util/Logger.h>

#include <memory>

#include "points/Clock.h"
#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// Channels and appenders that threads share: one that fails, one that rotates, levels that change.

namespace schedules {

namespace {

const std::string kFile = "appender.A=File\nappender.A.fileName=log\n";

// One write(2) a line, so no line is lost, doubled or torn.
void twoThreadsOneFile() {
    configure("rootCategory=INFO,A\n" + kFile);
    Logger logger("test");
    Parallel threads{[&] {
        logger.info("one");
        logger.info(std::string("two"));
    }};
    logger.warn("three");
    threads.join();
}

std::string checkThree(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"one", "two", "three"});
}

void twoChannels() {
    configure("rootCategory=INFO,A\ncategory.net=DEBUG,B,A\n" + kFile +
              "appender.B=File\nappender.B.fileName=other\n");
    Logger root("test");
    Logger net("net");
    Parallel threads{[&] { net.debug("one"); }, [&] { root.info("two"); }};
    net.info("three");
    threads.join();
}

std::string checkTwoChannels(const Remains& remains) {
    const std::string wrong =
        compare("the other log", Remains::lines(remains.file("other")), {"one", "three"});
    return wrong.empty() ? checkThree(remains) : wrong;
}

// Each line makes the file too large, and so makes it a backup.
void rotated() {
    configure("rootCategory=INFO,A\n" + kFile +
              "appender.A.maxFileSize=2\nappender.A.maxBackupIndex=5\n");
    Logger logger("test");
    Parallel threads{[&] { logger.info("one"); }, [&] { logger.info("two"); }};
    logger.info("three");
    threads.join();
}

std::string checkRotated(const Remains& remains) {
    std::string all;
    for (const char* name : {"log", "log.1", "log.2", "log.3", "log.4"})
        all += remains.file(name);
    if (!remains.file("log").empty()) return "the log was not rotated";
    return compare("the log with its backups", Remains::lines(all), {"one", "two", "three"});
}

// The file is moved away; six seconds later that must be noticed, and no line be lost.
void movedAway() {
    configure("rootCategory=INFO,A\n" + kFile);
    Logger logger("test");
    logger.info("one");
    require(Pathname("log").renameTo(Pathname("moved")), "the log is not moved");
    advanceClock(6);
    Parallel threads{[&] { logger.info("two"); }};
    logger.info("three");
    threads.join();
}

std::string checkMoved(const Remains& remains) {
    const std::string wrong =
        compare("the moved log", Remains::lines(remains.file("moved")), {"one"});
    return wrong.empty() ? compare("the log", Remains::lines(remains.file("log")), {"two", "three"})
                         : wrong;
}

void levelChanged() {
    configure("rootCategory=INFO,A\ncategory.net=INFO\n" + kFile);
    Logger net("net");
    Parallel threads{[&] {
        Logger::setChannelLevel("net", "DEBUG");
        net.debug("one");
    }};
    net.info("two");
    threads.join();
    net.debug("three");
    require(net.isDebugEnabled(), "the level was not changed");
}

// Makes the channel while others look it up.
void channelMade() {
    configure("rootCategory=INFO,A\n" + kFile);
    Parallel threads{[&] {
                         Logger::setChannelLevel("new", "DEBUG");
                         Logger own("new");
                         own.debug("one");
                     },
                     [&] {
                         Logger own("new");
                         own.info("two");
                     }};
    Logger::setChannelLevel("new", "DEBUG");
    Logger own("new");
    own.debug("three");
    threads.join();
}

// The one that fails does not keep the line from the one that works, and is told of there.
void oneFails() {
    configure("rootCategory=INFO,F,A\n" + kFile +
              "appender.F=File\nappender.F.fileName=/dev/full\n");
    Logger logger("test");
    Parallel threads{[&] { logger.info("one"); }};
    logger.info("two");
    threads.join();
}

const std::string kFull = "Error writing to \"/dev/full\": No space left on device";

std::string checkOneFails(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"one", "two", kFull, kFull});
}

const Register registered{
    {"appender-two-threads", &twoThreadsOneFile, &checkThree},
    {"appender-two-channels", &twoChannels, &checkTwoChannels},
    {"appender-rotated", &rotated, &checkRotated},
    {"appender-moved-away", &movedAway, &checkMoved},
    {"appender-one-fails", &oneFails, &checkOneFails},
    {"channel-level-changed", &levelChanged, &checkThree},
    {"channel-made", &channelMade, &checkThree},
};

}  // namespace

}  // namespace schedules
