#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>

#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using testsupport::ChildResult;
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
            _exit(0);
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
            if (storesteps::get("own") != "2" || storesteps::get("before") != "1") _exit(1);
        });
        return well == _times ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

}  // namespace
