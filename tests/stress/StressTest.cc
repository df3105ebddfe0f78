#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <gmock/gmock.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

// Much at once on each shared object; what the thread sanitizer is let loose on.

namespace {

using testsupport::ChildResult;
using testsupport::linesOf;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::testScale;
using testsupport::writeFile;

constexpr unsigned kThreads = 4;

// Runs body(0), body(1) ... at the same time.
void together(const std::function<void(unsigned)>& body) {
    std::vector<std::thread> threads;
    for (unsigned t = 0; t < kThreads; ++t)
        threads.emplace_back([&body, t] { body(t); });
    for (std::thread& thread : threads)
        thread.join();
}

void expectToEndWell(const std::function<int()>& body) {
    const ChildResult result = runInChild(body, 300);
    EXPECT_EQ(result.status, 0) << "signal " << result.signal << '\n' << result.err;
}

class Worker : public Thread {
  public:
    explicit Worker(std::atomic<unsigned>& right) : Thread("worker"), _right(right) {}

  private:
    void main() override {
        if (current() == this && std::string(currentName()) == "worker" && isCurrent()) ++_right;
    }

    std::atomic<unsigned>& _right;
};

TEST(StressTest, ThousandsOfShortThreadsKnowThemselves) {
    const unsigned each = 500 * testScale();
    expectToEndWell([=] {
        const Thread mainThread;
        std::atomic<unsigned> right{0};
        together([&](unsigned) {
            for (unsigned n = 0; n < each; ++n) {
                Worker worker(right);
                worker.go();
                worker.join();
            }
        });
        return right == kThreads * each ? 0 : 1;
    });
}

TEST(StressTest, FinishingThreadsAreJoinedByAnotherOnesQueue) {
    const unsigned count = 500 * testScale();
    expectToEndWell([=] {
        const Thread mainThread;
        std::atomic<unsigned> right{0};
        InThreadActorQueue queue;
        std::thread submitter([&] {
            for (unsigned n = 0; n < count; ++n) {
                auto worker = std::make_unique<Worker>(right);
                worker->go();
                queue.submit(worker.release()->joinHelper());
            }
        });
        std::size_t joined = 0;
        while (joined < count) {
            queue.waitForWork(1);
            joined += queue.runQueued();
        }
        submitter.join();
        return right == count ? 0 : 1;
    });
}

TEST(StressTest, ConcurrentPutsAllArrive) {
    const TempDir dir;
    const unsigned each = 500 * testScale();
    expectToEndWell([&] {
        storesteps::store().setDBFile(Pathname(dir.file("data")));
        together([&](unsigned t) {
            for (unsigned n = 0; n < each; ++n) {
                const std::string key = std::to_string(t) + "/" + std::to_string(n);
                storesteps::put(key, "value of " + key, n % 100 == 0);
                storesteps::put("shared", key);
            }
        });
        storesteps::store().saveToFile();
        storesteps::store().readFile();
        for (unsigned t = 0; t < kThreads; ++t) {
            for (unsigned n = 0; n < each; ++n) {
                const std::string key = std::to_string(t) + "/" + std::to_string(n);
                if (storesteps::get(key) != "value of " + key) return 1;
            }
        }
        return storesteps::all().size() == kThreads * each + 1 ? 0 : 2;
    });
}

class LoggingStress : public testing::Test {
  protected:
    // Two appenders with rotation, shared by three channels and the root.
    void initialize() const {
        std::string conf;
        for (const std::string name : {"A", "B"}) {
            const std::string appender = "appender." + name;
            conf += appender + "=File\n" + appender + ".fileName=" + _dir.file(name) + "\n" +
                    appender + ".maxFileSize=2000\n" + appender + ".maxBackupIndex=1000000\n" +
                    appender + ".layout.ConversionPattern=%d [%t] %-5p %c: %m%n\n";
        }
        conf += "rootCategory=INFO,A\ncategory.one=INFO,A,B\ncategory.two=DEBUG,B\n";
        writeFile(_dir.file("conf"), conf);
        Logger::initialize(Pathname(_dir.file("conf")), Pathname());
    }
    long linesWith(const char* file, const std::string& end) const {
        const auto lines = linesOf(_dir.file(file));
        return std::count_if(lines.begin(), lines.end(), [&](const std::string& line) {
            return line.size() >= end.size() &&
                   line.compare(line.size() - end.size(), end.size(), end) == 0;
        });
    }

    const TempDir _dir;
    const unsigned _each = 300 * testScale();
};

TEST_F(LoggingStress, NoLineIsLostOrDoubledWhileLevelsChangeAndFilesRotate) {
    expectToEndWell([&] {
        initialize();
        Logger one("one");
        Logger two("two");
        std::atomic<bool> done{false};
        std::thread changer([&] {
            for (bool debug = false; !done; debug = !debug) {
                Logger::setChannelLevel("one", debug ? "DEBUG" : "WARN");
                Logger::setChannelLevel(nullptr, debug ? "INFO" : "ERROR");
                Logger::setChannelLevel(debug ? "new" : "newer", "CRIT");
                const Logger passing("newer");
            }
        });
        together([&](unsigned t) {
            for (unsigned n = 0; n < _each; ++n) {
                one.error("one %u %u", t, n);
                two.info("two %u %u", t, n);
                one.debug("perhaps");
            }
        });
        done = true;
        changer.join();
        return 0;
    });
    for (unsigned t = 0; t < kThreads; ++t) {
        for (unsigned n = 0; n < _each; n += 37) {
            const std::string end = std::to_string(t) + " " + std::to_string(n);
            EXPECT_EQ(linesWith("A", "ERROR one: one " + end), 1);
            EXPECT_EQ(linesWith("B", "ERROR one: one " + end), 1);
            EXPECT_EQ(linesWith("B", "INFO  two: two " + end), 1);
        }
    }
    const auto all = linesOf(_dir.file("B"));
    const auto debug = std::count_if(all.begin(), all.end(), [](const std::string& line) {
        return line.find("perhaps") != std::string::npos;
    });
    EXPECT_EQ(all.size(), kThreads * _each * 2 + static_cast<std::size_t>(debug));
}

// However many write at once: the line that passes the limit is the last one of its file.
TEST_F(LoggingStress, OneLineAtMostPassesTheLimitOfAFile) {
    const std::size_t limit = 2000;
    expectToEndWell([&] {
        initialize();
        Logger logger("test");
        together([&](unsigned t) {
            for (unsigned n = 0; n < _each; ++n)
                logger.info("%u %.*s", t, static_cast<int>(n % 60), std::string(60, 'x').c_str());
        });
        return 0;
    });
    unsigned backups = 0;
    for (;; ++backups) {
        const std::string file = _dir.file("A." + std::to_string(backups + 1));
        if (access(file.c_str(), F_OK) != 0) break;
        const std::string text = readFile(file);
        const std::size_t lastLine = text.rfind('\n', text.size() - 2) + 1;
        EXPECT_GT(text.size(), limit) << file;
        EXPECT_LE(lastLine, limit) << file;
    }
    EXPECT_GT(backups, 10u);
    EXPECT_LE(readFile(_dir.file("A")).size(), limit);
}

TEST_F(LoggingStress, ThreadsMayLogWhileTheProcessExits) {
    for (unsigned n = 0; n < 20 * testScale(); ++n) {
        expectToEndWell([&] {
            initialize();
            static Logger logger("one");
            std::atomic<unsigned> logged{0};
            for (unsigned t = 0; t < kThreads; ++t) {
                std::thread([&logged] {
                    for (;;) {
                        logger.info("still running");
                        Logger("two").error("and building loggers");
                        ++logged;
                    }
                }).detach();
            }
            while (logged < 10) {
            }
            std::atexit([] { logger.info("exit handler"); });
            std::exit(0);
            return 1;
        });
        for (const std::string& name : _dir.names())
            Pathname(_dir.file(name)).unlink();
    }
}

}  // namespace
