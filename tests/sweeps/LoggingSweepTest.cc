#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <cerrno>
#include <new>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using testing::UnorderedElementsAre;
using testsupport::Call;
using testsupport::linesOf;
using testsupport::ownStderr;
using testsupport::sweep;
using testsupport::SweptFault;
using testsupport::TempDir;
using testsupport::writeFile;

const unsigned kMessages = 12 * testsupport::testScale();

std::string message(unsigned n) {
    return "message " + std::to_string(n) + " of this run";
}

// Logs under the fault; every call has to leave errno alone.
void logAll(Logger& logger, SweptFault& fault) {
    fault.arm();
    for (unsigned n = 0; n < kMessages; ++n) {
        errno = EXDEV;
        logger.info("message %u of this run", n);
        EXPECT_EQ(errno, EXDEV);
    }
    fault.disarm();
}

std::vector<std::string> lost(const std::vector<std::string>& lines) {
    std::vector<std::string> missing;
    for (unsigned n = 0; n < kMessages; ++n) {
        if (std::count(lines.begin(), lines.end(), message(n)) == 0) missing.push_back(message(n));
    }
    return missing;
}

class LoggingSweep : public testing::Test {
  protected:
    // Rotates after every fourth line and keeps them all.
    void initialize() const {
        writeFile(_dir.file("conf"), "appender.A=File\nappender.A.fileName=" + _log +
                                         "\nappender.A.maxFileSize=80\n"
                                         "appender.A.maxBackupIndex=1000\n"
                                         "rootCategory=INFO,A\n");
        EXPECT_TRUE(Logger::initialize(Pathname(_dir.file("conf")), Pathname()));
    }
    // What holds after every fault: no line is torn, and the next ones arrive.
    void nextLineArrives(Logger& logger) const {
        logger.info("message %u of this run", kMessages);
        const auto lines = linesOf(_log);
        EXPECT_EQ(std::count(lines.begin(), lines.end(), message(kMessages)), 1);
        for (const std::string& line : lines)
            EXPECT_TRUE(line.rfind("message ", 0) == 0 && line.find(" of this run") != line.npos)
                << line;
    }
    void emptyDirectory() const {
        for (const std::string& name : _dir.names())
            Pathname(_dir.file(name)).unlink();
    }

    const TempDir _dir;
    const std::string _log = _dir.file("log");
};

TEST_F(LoggingSweep, ALineIsInAFileOrItsLossIsReportedOnce) {
    const auto swept = sweep(
        "log to a file",
        {Call::open, Call::write, Call::fstat, Call::close, Call::pthread_mutex_lock},
        [&](SweptFault& fault) {
            emptyDirectory();
            initialize();
            Logger logger("test");
            logAll(logger, fault);
            const std::string told = ownStderr();
            const auto reports = std::count(told.begin(), told.end(), '\n');
            // Where no write works at all the reports are lost as well.
            if (!fault.isOf(Call::write) || !fault.lasts()) {
                EXPECT_LE(lost(linesOf(_log)).size(), static_cast<std::size_t>(reports)) << told;
            }
            EXPECT_LE(reports, kMessages * 2);
            nextLineArrives(logger);
        });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::open, Call::write, Call::fstat, Call::close,
                                                  Call::pthread_mutex_lock));
    EXPECT_GT(swept.points, 100U);
}

// The rotation does not look at what these say, so an old backup may be overwritten; the line in
// hand and the next ones are none the worse.
TEST_F(LoggingSweep, ARotationThatFailsHarmsNoLaterLine) {
    const auto swept =
        sweep("rotate", {Call::access, Call::rename, Call::allocation}, [&](SweptFault& fault) {
            emptyDirectory();
            initialize();
            Logger logger("test");
            logAll(logger, fault);
            nextLineArrives(logger);
        });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::access, Call::rename, Call::allocation));
    EXPECT_GT(swept.points, 40U);
}

// One backup, which goes at each rotation, and messages so far apart that each one looks at the
// file's identity.
TEST_F(LoggingSweep, AFileThatCannotBeLookedAtOrRemovedIsNoLostLine) {
    const auto swept =
        sweep("remove and check", {Call::unlink, Call::stat}, [&](SweptFault& fault) {
            emptyDirectory();
            LogAppender appender;
            appender.setAttribute("fileName", _log.c_str(), Pathname());
            appender.setAttribute("maxFileSize", "80", Pathname());
            appender.setAttribute("maxBackupIndex", "1", Pathname());
            const Logger logger("test");
            fault.arm();
            for (unsigned n = 0; n < kMessages; ++n) {
                LogMsgMetadata facts(&logger, INFO);
                facts.stamp.set(static_cast<int>(1000 + 10 * n), 0);
                appender.write(facts, message(n));
            }
            fault.disarm();
            const auto lines = linesOf(_log);
            EXPECT_EQ(std::count(lines.begin(), lines.end(), message(kMessages - 1)), 1);
            EXPECT_LE(lines.size(), 8U);
            EXPECT_EQ(_dir.names().size(), 2U);
        });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::unlink, Call::stat));
}

}  // namespace
