#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "support/KilledChild.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using testsupport::Call;
using testsupport::killAfter;
using testsupport::killAtCall;
using testsupport::linesOf;
using testsupport::Shared;
using testsupport::TempDir;
using testsupport::testScale;
using testsupport::writeFile;

constexpr unsigned kThreads = 2;

// For each thread, how many of its lines had been logged: the call had returned.
struct Progress {
    std::atomic<unsigned> logged[kThreads];
};

std::string line(unsigned thread, unsigned n) {
    return "thread " + std::to_string(thread) + " line " + std::to_string(n) + " end";
}

class LoggingCrash : public testing::Test {
  protected:
    // Logs with rotation until it is killed.
    void logForEver() {
        writeFile(_dir->file("conf"), "appender.A=File\nappender.A.fileName=" + _dir->file("log") +
                                          "\nappender.A.maxFileSize=200\n"
                                          "appender.A.maxBackupIndex=100000\n"
                                          "rootCategory=INFO,A\n");
        Logger::initialize(Pathname(_dir->file("conf")), Pathname());
        Logger logger("test");
        std::vector<std::thread> threads;
        for (unsigned t = 0; t < kThreads; ++t) {
            threads.emplace_back([this, &logger, t] {
                for (unsigned n = 0; n < 400; ++n) {
                    logger.info(line(t, n));
                    _progress->logged[t] = n + 1;
                }
            });
        }
        for (std::thread& thread : threads)
            thread.join();
    }
    void expectEveryLine() const {
        const auto lines = linesOf(_dir->file("log"));
        unsigned lost = 0;
        for (unsigned t = 0; t < kThreads; ++t) {
            for (unsigned n = 0; n < _progress->logged[t]; ++n)
                lost += std::count(lines.begin(), lines.end(), line(t, n)) == 1 ? 0 : 1;
        }
        EXPECT_EQ(lost, 0U);
        for (const std::string& text : lines)
            EXPECT_THAT(text, testing::MatchesRegex("thread [01] line [0-9]+ end"));
    }
    void startAgain() {
        _dir.emplace();
        for (auto& logged : _progress->logged)
            logged = 0;
    }

    std::optional<TempDir> _dir;
    const Shared<Progress> _progress;
};

TEST_F(LoggingCrash, EveryLineWhoseCallHadReturnedSurvivesAKillAtEachCall) {
    unsigned kills = 0;
    for (const Call call : {Call::write, Call::open, Call::rename, Call::close, Call::fstat}) {
        for (unsigned long k = 1; k <= 12 * testScale(); ++k) {
            startAgain();
            if (!killAtCall(call, k, [this] { logForEver(); })) break;
            ++kills;
            expectEveryLine();
        }
    }
    EXPECT_GE(kills, 50U);
    std::printf("[  killed  ] logging: %u times\n", kills);
}

TEST_F(LoggingCrash, EveryLineWhoseCallHadReturnedSurvivesAKillAtAnyMoment) {
    unsigned kills = 0;
    for (unsigned n = 0; n < 20 * testScale(); ++n) {
        startAgain();
        if (killAfter(200 + 137 * n % 5000, [this] { logForEver(); })) ++kills;
        expectEveryLine();
    }
    EXPECT_GT(kills, 0U);
    std::printf("[  killed  ] logging, at random: %u times\n", kills);
}

}  // namespace
