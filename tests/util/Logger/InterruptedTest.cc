#include <korvex/util/Logger.h>
#include <korvex/util/Logger/LogAppender.h>

#include <gmock/gmock.h>
#include <pthread.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <string>
#include <thread>

#include "base/HeldLocks.h"
#include "support/Child.h"
#include "support/LogFiles.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

// What interrupts a thread that is logging: a signal whose handler logs, a cancellation.

namespace {

using testsupport::ChildResult;
using testsupport::linesOf;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::testScale;

Logger& logger() {
    static Logger instance("test");
    return instance;
}

void logTo(const std::string& file) {
    LogAppender* const a = LogAppender::find("A", true);
    a->setAttribute("fileName", file.c_str(), Pathname());
    a->setAttribute("layout.ConversionPattern", "%d %m%n", Pathname());
    LogChannel::find("test", true)->setConfig("INFO,A");
    Logger::initialize();
    logger();
}

TEST(InterruptedTest, InsideAnyOfTheLocksALineGoesToStandardError) {
    const TempDir dir;
    const ChildResult result = runInChild([&] {
        logTo(dir.file("log"));
        const HeldLocks::One held;
        errno = ENOENT;
        __extension__ logger().warn("%s: %m", "formatted");
        logger().error(std::string("100%"));
        logger().debug("filtered");
        Logger("other").debug("filtered by the root");
        return errno == ENOENT ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "WARN - formatted: No such file or directory\nERROR - 100%\n");
    EXPECT_EQ(linesOf(dir.file("log")).size(), 0U);
}

std::atomic<unsigned> handled{0};

TEST(InterruptedTest, AHandlerThatLogsWhereverItInterruptsLoggingComesThrough) {
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer complains of every allocation in a signal handler";
#endif
    const TempDir dir;
    const unsigned times = 300 * testScale();
    const ChildResult result = runInChild([&] {
        logTo(dir.file("log"));
        struct sigaction action {};
        action.sa_handler = [](int) {
            // No conversions: what they need of the C library is not safe in a handler.
            logger().warn(std::string("handler"));
            ++handled;
        };
        action.sa_flags = SA_RESTART;
        sigaction(SIGUSR1, &action, nullptr);
        const pthread_t interrupted = pthread_self();
        std::thread interrupter([&] {
            for (unsigned n = 0; n < times; ++n) {
                pthread_kill(interrupted, SIGUSR1);
                while (handled == n)
                    std::this_thread::yield();
            }
        });
        while (handled < times)
            logger().info(std::string(3000, 'x'));
        interrupter.join();
        return 0;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
    const auto lines = linesOf(dir.file("log"));
    const auto inFile = std::count_if(lines.begin(), lines.end(), [](const std::string& line) {
        return line.size() > 8 && line.substr(line.size() - 8) == " handler";
    });
    std::size_t onStderr = 0;
    const std::string line = "WARN - handler\n";
    for (std::size_t at = 0; (at = result.err.find(line, at)) != std::string::npos;
         at += line.size())
        ++onStderr;
    EXPECT_EQ(onStderr * line.size(), result.err.size());
    EXPECT_GE(static_cast<unsigned>(inFile) + onStderr, times);
}

TEST(InterruptedTest, ACancelledThreadFinishesItsLineAndEnds) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the address sanitizer takes the stack that a cancelled thread left for in use";
#endif
    const TempDir dir;
    const ChildResult result = runInChild([&] {
        logTo(dir.file("log"));
        for (unsigned n = 0; n < 50 * testScale(); ++n) {
            static std::atomic<bool> logging;
            logging = false;
            pthread_t thread;
            const auto run = [](void*) -> void* {
                for (;;) {
                    logger().info("%s", "whole");
                    logging = true;
                    pthread_testcancel();
                }
            };
            if (pthread_create(&thread, nullptr, run, nullptr) != 0) return 1;
            while (!logging) {
            }
            pthread_cancel(thread);
            void* how = nullptr;
            pthread_join(thread, &how);
            if (how != PTHREAD_CANCELED) return 2;
        }
        logger().info("%s", "whole");
        return 0;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
    for (const std::string& line : linesOf(dir.file("log")))
        ASSERT_EQ(line.substr(line.size() - 6), " whole");
}

}  // namespace
