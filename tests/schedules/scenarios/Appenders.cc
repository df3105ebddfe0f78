#include <korvex/util/Logger.h>

#include <sys/resource.h>

#include <csignal>
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

// Lines of four bytes, of which the third one passes the limit: never more in a file than that.
void limited() {
    configure("rootCategory=INFO,A\n" + kFile +
              "appender.A.maxFileSize=8\nappender.A.maxBackupIndex=5\n");
    Logger logger("test");
    logger.info("one");
    Parallel threads{[&] {
                         logger.info("two");
                         logger.info("six");
                     },
                     [&] { logger.info("ten"); }};
    logger.info("end");
    threads.join();
}

std::string checkLimited(const Remains& remains) {
    std::string all;
    for (const char* name : {"log", "log.1", "log.2"})
        all += remains.file(name);
    if (remains.file("log.1").size() != 12) return "the backup is not what passes the limit";
    return compare("the log with its backups", Remains::lines(all),
                   {"one", "two", "six", "ten", "end"});
}

// The system lets nobody write more than sixty bytes into a file: the second line is cut, and as
// the limit is passed then, the file is rotated.
std::string filled(char c) {
    return std::string(40, c);
}

void cut() {
    configure("rootCategory=INFO,A\n" + kFile +
              "appender.A.maxFileSize=50\nappender.A.maxBackupIndex=5\n");
    std::signal(SIGXFSZ, SIG_IGN);
    const rlimit sixty{60, 60};
    require(setrlimit(RLIMIT_FSIZE, &sixty) == 0, "no limit of file sizes");
    Logger logger("test");
    logger.info(filled('1'));
    Parallel threads{[&] { logger.info(filled('2')); }};
    logger.info(filled('3'));
    threads.join();
}

std::string checkCut(const Remains& remains) {
    const std::string log = remains.file("log");
    if (log != filled('2') + "\n" && log != filled('3') + "\n") return "the log holds " + log;
    const char lost = log[0] == '2' ? '3' : '2';
    if (remains.file("log.1") != filled('1') + "\n" + std::string(19, lost))
        return "the backup holds " + remains.file("log.1");
    return compare("standard error", Remains::lines(remains.err),
                   {"CRIT - Error writing to \"log\": File too large"});
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
    {"appender-limited", &limited, &checkLimited},
    {"appender-line-cut", &cut, &checkCut},
    {"appender-moved-away", &movedAway, &checkMoved},
    {"appender-one-fails", &oneFails, &checkOneFails},
    {"channel-level-changed", &levelChanged, &checkThree},
    {"channel-made", &channelMade, &checkThree},
};

}  // namespace

}  // namespace schedules
