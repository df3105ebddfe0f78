#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <gmock/gmock.h>
#include <pthread.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/Faults.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"
#include "util/Logger/LoggingLocks.h"

namespace {

using testsupport::Call;
using testsupport::ChildResult;
using testsupport::Dwell;
using testsupport::linesOf;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::testScale;
using testsupport::writeFile;

// Threads that do `work` again and again while this object lives.
class Busy {
  public:
    explicit Busy(const std::function<void()>& work) {
        for (int i = 0; i < 3; ++i) {
            _threads.emplace_back([this, work] {
                while (!_stop) {
                    work();
                    // Locks are not fair: without a pause the forking thread would starve.
                    std::this_thread::sleep_for(std::chrono::microseconds(20));
                }
            });
        }
    }
    Busy(const Busy&) = delete;
    Busy& operator=(const Busy&) = delete;
    ~Busy() {
        _stop = true;
        for (std::thread& thread : _threads)
            thread.join();
    }

  private:
    std::atomic<bool> _stop{false};
    std::vector<std::thread> _threads;
};

// Forks again and again; how many children ended well. A child that hangs dies of its alarm.
unsigned forkAndDo(unsigned times, const std::function<void()>& work) {
    unsigned well = 0;
    for (unsigned n = 0; n < times; ++n) {
        const pid_t pid = fork();
        if (pid == 0) {
            alarm(10);
            work();
            testsupport::endForkedChild(0);
        }
        int status = -1;
        if (waitpid(pid, &status, 0) == pid && status == 0) ++well;
    }
    return well;
}

class ForkTest : public testing::Test {
  protected:
    const TempDir _dir;
    const unsigned _times = 100 * testScale();
};

TEST_F(ForkTest, AChildLogsWhileTheParentsThreadsHoldTheLoggingLocks) {
    const ChildResult result = runInChild([&] {
        writeFile(_dir.file("conf"), "appender.A=File\nappender.A.fileName=" + _dir.file("log") +
                                         "\nappender.A.maxFileSize=100000\n"
                                         "appender.A.maxBackupIndex=1000\nrootCategory=INFO,A\n");
        Logger::initialize(Pathname(_dir.file("conf")), Pathname());
        Logger logger("test");
        const Busy busy([&] {
            logger.info("parent");
            Logger another("another");
        });
        const unsigned well = forkAndDo(_times, [&] {
            Logger own("own");
            own.info("child");
            Logger::setChannelLevel("own", "DEBUG");
        });
        return well == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
    const auto lines = linesOf(_dir.file("log"));
    EXPECT_EQ(std::count(lines.begin(), lines.end(), "child"), _times);
}

TEST_F(ForkTest, AChildLogsBeforeAnythingIsConfigured) {
    const ChildResult result = runInChild([&] {
        Logger logger("test");
        const Busy busy([&] { logger.info("parent"); });
        return forkAndDo(_times, [&] { logger.info("child"); }) == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

TEST_F(ForkTest, AChildUsesTheStoreWhileTheParentsThreadsPut) {
    const ChildResult result = runInChild([&] {
        storesteps::store().setDBFile(Pathname(_dir.file("data")));
        storesteps::put("before", "1");
        const Busy busy([] { storesteps::put("key", std::string(100, 'x'), true); });
        const unsigned well = forkAndDo(_times, [&] {
            storesteps::store().setDBFile(Pathname(_dir.file("child")));
            storesteps::put("own", "2", true);
            if (storesteps::get("own") != "2" || storesteps::get("before") != "1")
                testsupport::endForkedChild(1);
        });
        return well == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

// What the C library does under a lock of its own, which a child would inherit held for ever.
TEST_F(ForkTest, NoThreadIsInTheMiddleOfLocalTimeOrOfAnErrorText) {
    for (const Call call : {Call::localtime_r, Call::strftime, Call::strerror_r}) {
        const ChildResult result = runInChild([&] {
            writeFile(_dir.file("conf"),
                      "appender.A=File\nappender.A.fileName=" + _dir.file("log") +
                          "\nappender.A.layout.ConversionPattern=%d{%c} %m%n\n"
                          "rootCategory=INFO,A\n");
            Logger::initialize(Pathname(_dir.file("conf")), Pathname());
            Logger logger("test");
            const Dwell dwell(call, 300);
            const Busy busy([&] { __extension__ logger.info("parent: %m"); });
            while (dwell.count() == 0)
                std::this_thread::yield();
            const unsigned well = forkAndDo(20, [&] {
                if (dwell.inside() != 0) testsupport::endForkedChild(1);
                __extension__ logger.info("child: %m");
            });
            return well == 20 ? 0 : 1;
        });
        EXPECT_EQ(result.status, 0) << testsupport::nameOf(call);
    }
}

// A report is put into words under the appender's lock, and asks the C library for the error's
// text.
TEST_F(ForkTest, AProcessForksWhileItsThreadsReportFailures) {
    const ChildResult result = runInChild([&] {
        LogAppender::find("bad", true)
            ->setAttribute("fileName", _dir.file("missing/log").c_str(), Pathname());
        LogAppender::find("good", true)
            ->setAttribute("fileName", _dir.file("log").c_str(), Pathname());
        LogChannel::find("test", true)->setConfig("bad");
        LogChannel::find("Logger", true)->setConfig("good");
        Logger::initialize();
        Logger logger("test");
        const Dwell dwell(Call::strerror_r, 200);
        const Busy busy([&] { logger.info("lost"); });
        return forkAndDo(_times, [&] { logger.info("lost"); }) == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

// The first line of a kind builds what all later ones share.
class FirstLineTest : public ForkTest, public testing::WithParamInterface<Call> {};

TEST_P(FirstLineTest, AChildIsForkedWhileAThreadBuildsWhatALineNeeds) {
    for (int n = 0; n < 5; ++n) {
        const ChildResult result = runInChild([] {
            static Logger logger("test");
            const Dwell dwell(GetParam(), 20000);
            std::atomic<bool> done{false};
            std::thread first([&done] {
                LogFormat::internal(nullptr, WARN, "first report");
                logger.info("%s", "first line");
                done = true;
            });
            // Most of it stands since before this very process was forked.
            while (dwell.inside() == 0 && !done)
                std::this_thread::yield();
            const unsigned well = forkAndDo(1, [] {
                LogFormat::internal(nullptr, WARN, "child's report");
                logger.info("%s", "child's line");
            });
            first.join();
            return well == 1 ? 0 : 1;
        });
        EXPECT_EQ(result.status, 0) << result.signal;
    }
}

INSTANTIATE_TEST_SUITE_P(Builds, FirstLineTest,
                         testing::Values(Call::pthread_mutex_lock, Call::pthread_mutex_init,
                                         Call::pthread_key_create),
                         [](const auto& tested) { return testsupport::nameOf(tested.param); });

// Handlers of the program, registered by a static initialiser, that log before a fork and on both
// sides after it, and take a lock under which other threads log.
struct ProgramsHandlers {
    ProgramsHandlers() { pthread_atfork(&before, &after, &after); }

    static void before() {
        if (!active) return;
        lock.lock();
        logger().info("before %d", 1);
    }
    static void after() {
        if (!active) return;
        logger().info("after %s", "it");
        lock.unlock();
    }
    static Logger& logger() {
        static Logger instance("handlers");
        return instance;
    }

    static inline bool active = false;
    static inline std::mutex lock;
};
const ProgramsHandlers programsHandlers;

TEST_F(ForkTest, HandlersOfTheProgramMayLogAndTakeLocksUnderWhichOthersLog) {
    const ChildResult result = runInChild([&] {
        writeFile(_dir.file("conf"), "appender.A=File\nappender.A.fileName=" + _dir.file("log") +
                                         "\nappender.A.layout.ConversionPattern=%d %m%n\n"
                                         "rootCategory=INFO,A\n");
        Logger::initialize(Pathname(_dir.file("conf")), Pathname());
        Logger logger("test");
        ProgramsHandlers::logger();
        ProgramsHandlers::active = true;
        const Busy busy([&] {
            const std::lock_guard<std::mutex> guard(ProgramsHandlers::lock);
            logger.info("parent");
        });
        const unsigned well = forkAndDo(_times, [&] { logger.info("child"); });
        ProgramsHandlers::active = false;
        return well == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
    const auto lines = linesOf(_dir.file("log"));
    const auto linesThatEnd = [&](const std::string& end) {
        return std::count_if(lines.begin(), lines.end(), [&](const std::string& line) {
            return line.size() > end.size() && line.substr(line.size() - end.size()) == end;
        });
    };
    EXPECT_EQ(linesThatEnd(" before 1"), _times);
    EXPECT_EQ(linesThatEnd(" after it"), 2 * _times);
    EXPECT_EQ(linesThatEnd(" child"), _times);
}

// A handler that runs while the logging system's own have run already has all the locks.
TEST_F(ForkTest, BetweenItsOwnHandlersTheForkingThreadLogsWithoutWaitingForItself) {
    const ChildResult result = runInChild([&] {
        LogAppender::find("A", true)->setAttribute("fileName", _dir.file("log").c_str(), {});
        LogChannel::find("test", true)->setConfig("A");
        Logger early("test");
        LoggingLocks::takeAll();
        early.info("early");
        Logger("other").info("on standard error");
        LogFormat::internal(nullptr, WARN, "report");
        EXPECT_TRUE(Logger::setChannelLevel("new", "DEBUG"));
        Logger::initialize();
        Logger("test").info("in the file");
        LoggingLocks::freeAll();
        Logger("test").info("and after");
        return 0;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
    EXPECT_EQ(result.err, "early\non standard error\nreport\n");
    EXPECT_EQ(linesOf(_dir.file("log")), (std::vector<std::string>{"in the file", "and after"}));
}

TEST_F(ForkTest, AChildMakesThreadsOfItsOwnWhileTheParentsComeAndGo) {
#if defined(__SANITIZE_THREAD__) || defined(__SANITIZE_ADDRESS__)
    GTEST_SKIP() << "a child inherits the sanitizer's own list of threads locked";
#endif
    const ChildResult result = runInChild([&] {
        const Thread mainThread;
        struct Short : Thread {
            Short() : Thread("short") {}
            void main() override {}
        };
        const auto run = [] {
            Short worker;
            worker.go();
            worker.join();
        };
        const Busy busy(run);
        return forkAndDo(_times, run) == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

TEST_F(ForkTest, TheEpochIsNotTheMomentOfAFork) {
    const ChildResult result = runInChild([&] {
        const pid_t pid = fork();
        if (pid == 0) _exit(0);
        waitpid(pid, nullptr, 0);
        const Timeval before = Timeval::now();
        return epoch_timeval() < before ? 1 : 0;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

}  // namespace
