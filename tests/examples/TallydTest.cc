#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "examples/RunningTallyd.h"
#include "tools/ExecTool.h"

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;
using testsupport::ChildResult;
using testsupport::readFile;
using testsupport::TallydTest;
using testsupport::writeFile;

constexpr int kEndedWell = 0;  // wait(2)'s status of an exit with 0

TEST_F(TallydTest, ATerminatedDaemonHasCountedSavedAndLoggedEverything) {
    ASSERT_EQ(start().status, 0);
    for (const char* name : {"apple", "pear\n", "apple", "no name", "", "apple\n"})
        send(name);
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    EXPECT_EQ(saved("apple"), "3");
    EXPECT_EQ(saved("pear"), "1");
    EXPECT_EQ(records({"list"}).out, "count/apple\ncount/pear\n");
    EXPECT_THAT(log("tallyd.log"),
                ElementsAre("[Main Thread] INFO  counters: loaded 0 counts",
                            "[Main Thread] INFO  tallyd: korvexd started",
                            "[Main Thread] INFO  tallyd: ending by signal 15",
                            "[Main Thread] INFO  counters: saved 2 changed counts",
                            "[Main Thread] INFO  tallyd: ended"));
    EXPECT_THAT(log("receiver.log"), ElementsAre(StartsWith("INFO  opened port "),
                                                 "WARN  refused 7 bytes", "WARN  refused 0 bytes"));
    EXPECT_EQ(pid(), 0);
}

TEST_F(TallydTest, WhatArrivedBeforeTheSignalIsCounted) {
    // A log that is a full pipe holds the receiver up at its first line, until the end has begun.
    const std::string path = dir.file("home/var/log/receiver.log");
    ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
    const int pipe = open(path.c_str(), O_RDWR | O_NONBLOCK);
    ASSERT_EQ(start().status, 0);
    while (write(pipe, "x", 1) == 1) {
    }
    send("no name");
    for (int n = 0; n < 100; ++n)
        send("apple");
    const pid_t daemon = pid();
    signal(SIGTERM);
    eventually([this] {
        return log("tallyd.log").back() == "[Main Thread] INFO  tallyd: ending by signal 15";
    });
    char bytes[4096];
    while (read(pipe, bytes, sizeof bytes) > 0) {
    }
    EXPECT_EQ(endOf(daemon), kEndedWell);
    close(pipe);
    EXPECT_EQ(saved("apple"), "100");
}

TEST_F(TallydTest, TheNextRunGoesOnCounting) {
    for (const char* expected : {"1", "2", "3"}) {
        ASSERT_EQ(start().status, 0);
        send("apple");
        EXPECT_EQ(end(SIGTERM), kEndedWell);
        EXPECT_EQ(saved("apple"), expected);
    }
}

TEST_F(TallydTest, AFreshStartKeepsTheOldFileAside) {
    ASSERT_EQ(start().status, 0);
    send("apple");
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    ASSERT_EQ(start({"--mode", "fresh"}).status, 0);
    send("pear");
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    EXPECT_EQ(records({"list"}).out, "count/pear\n");
    EXPECT_EQ(records({"-f", dir.file("db/hashDb/data.old"), "list"}).out, "count/apple\n");
}

TEST_F(TallydTest, TheStarterReturnsWhenThePortIsOpen) {
    ASSERT_EQ(start().status, 0);
    EXPECT_THAT(log("receiver.log"), ElementsAre(StartsWith("INFO  opened port ")));
    EXPECT_THAT(log("tallyd.log"), Contains("[Main Thread] INFO  tallyd: korvexd started"));
    EXPECT_NE(getsid(pid()), getsid(0));
    EXPECT_EQ(std::filesystem::read_symlink("/proc/" + std::to_string(pid()) + "/cwd"), "/");
    EXPECT_EQ(std::filesystem::read_symlink("/proc/" + std::to_string(pid()) + "/fd/2"),
              "/dev/null");
}

TEST_F(TallydTest, InTheForegroundAnInterruptEndsIt) {
    startInForeground();
    EXPECT_EQ(end(SIGINT), kEndedWell);
    EXPECT_THAT(log("tallyd.log"), Contains("[Main Thread] INFO  tallyd: ending by signal 2"));
}

TEST_F(TallydTest, DebugLogsEveryDatagramWithItsWorkersName) {
    ASSERT_EQ(start({"--debug", "-n", "fruit"}).status, 0);
    send("apple");
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    const auto lines = log("debug.log");
    EXPECT_THAT(lines, Contains("[Main Thread] INFO  tallyd: fruit started"));
    EXPECT_THAT(lines, Contains("[receiver] DEBUG receiver: counted apple"));
    EXPECT_THAT(lines,
                Contains("[Main Thread] DEBUG recordFileManager: Writing record file to disk."));
    EXPECT_FALSE(std::filesystem::exists(dir.file("home/var/log/tallyd.log")));
}

TEST_F(TallydTest, ThereIsOneAtATime) {
    ASSERT_EQ(start().status, 0);
    const pid_t first = pid();
    const ChildResult second = start();
    EXPECT_EQ(second.status, 1);
    EXPECT_EQ(second.err, "tallyd: already running: another process has locked " +
                              dir.file("db/tallyd.pid") + "\n");
    EXPECT_EQ(pid(), first);
    EXPECT_EQ(end(SIGTERM), kEndedWell);
}

TEST_F(TallydTest, AFailedStartIsToldToWhoeverStartedIt) {
    const ChildResult result = start({"-h", "203.0.113.1"});  // nobody's address
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("of 203.0.113.1: Cannot assign requested address\n"));
    EXPECT_THAT(log("tallyd.log"), Contains(HasSubstr("FATAL tallyd: cannot open port ")));
    EXPECT_EQ(pid(), 0);

    std::filesystem::remove(dir.file("home/etc/myinstall/log.cfg"));
    const ChildResult unconfigured = start();
    EXPECT_EQ(unconfigured.status, 1);
    EXPECT_THAT(unconfigured.err, StartsWith("Couldn't open log file configuration "));
}

TEST_F(TallydTest, AWrongStartIsRefusedBeforeAnythingIsTouched) {
    EXPECT_EQ(start({"--mode", "sideways"}).err,
              "tallyd: The mode must be \"fresh\", or not given.\n");
    EXPECT_EQ(start({"-p", "65536"}).err, "tallyd: The port must be 1 to 65535.\n");
    EXPECT_EQ(start({"-i", "none"}).err,
              "tallyd: The common config path must point at an existing path.\n");
    EXPECT_THAT(start({"--loud"}).err, StartsWith("Bad Option --loud\nUsage: "));
    for (const auto& wrong : {"--mode=sideways", "-p65536", "-inone", "--loud"})
        EXPECT_EQ(start({wrong}).status, 2) << wrong;
    EXPECT_TRUE(std::filesystem::is_empty(dir.file("db")));
    EXPECT_TRUE(std::filesystem::is_empty(dir.file("home/var/log")));
}

TEST_F(TallydTest, ASaveThatFailsLeavesTheFileAndIsTriedAgain) {
    ASSERT_EQ(start().status, 0);
    send("apple");
    eventually([this] { return signal(SIGHUP), saved("apple") == "1"; });
    std::filesystem::create_directories(dir.file("db/hashDb/data.new/in the way"));
    send("apple");
    eventually([this] {
        signal(SIGHUP);
        const auto lines = log("tallyd.log");
        return !lines.empty() && lines.back().find("; it is as it was") != std::string::npos;
    });
    EXPECT_EQ(saved("apple"), "1");
    std::filesystem::remove_all(dir.file("db/hashDb/data.new"));
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    EXPECT_EQ(saved("apple"), "2");
}

TEST_F(TallydTest, ASaveThatIsCutShortIsNotTaken) {
    const auto limitFiles = [] {
        const struct rlimit limit { 4096, 4096 };
        setrlimit(RLIMIT_FSIZE, &limit);
        std::signal(SIGXFSZ, SIG_IGN);
    };
    ASSERT_EQ(start({}, limitFiles).status, 0);
    send("apple");
    eventually([this] { return signal(SIGHUP), saved("apple") == "1"; });
    for (int n = 100; n < 200; ++n)
        send("apple-and-a-name-that-takes-much-room-in-the-file-" + std::to_string(n));
    const int status = end(SIGTERM);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 1);
    EXPECT_THAT(log("tallyd.log").back(),
                "[Main Thread] FATAL tallyd: ended without the last counts");
    EXPECT_EQ(records({"check"}).status, 0);
    EXPECT_EQ(records({"list"}).out, "count/apple\n");
}

TEST_F(TallydTest, ItsLoggingConfigurationsHoldNothingUnmeant) {
    for (const char* name : {"log-cmdline.cfg", "myinstall/log.cfg", "myinstall/log-debug.cfg"}) {
        const ChildResult result = testsupport::runInChild([&] {
            testsupport::execLogcheck({dir.file("home/etc/") + name, "--home", dir.file("home")});
            return 127;
        });
        EXPECT_EQ(result.status, 0) << result.out << result.err;
    }
}

// A text of the file that comes with the daemon, with one piece replaced.
std::string replaced(const std::string& text, const std::string& from, const std::string& to) {
    const std::size_t place = text.find(from);
    EXPECT_NE(place, std::string::npos) << from;
    return place == std::string::npos ? text : std::string(text).replace(place, from.size(), to);
}

TEST_F(TallydTest, LogrotateTakesItsLogAndLosesNoLine) {
    const std::string path = "PATH=$PATH:/usr/sbin ";
    if (std::system((path + "command -v logrotate > /dev/null").c_str()) != 0) {
        GTEST_SKIP() << "logrotate is not installed";
    }
    std::string conf = readFile(KORVEX_SOURCE_DIR "/examples/daemon/system/tallyd.logrotate");
    conf = replaced(conf, "/opt/tallyd", dir.file("home"));
    writeFile(dir.file("conf"), replaced(conf, "    su tallyd tallyd\n", ""));
    ASSERT_EQ(start().status, 0);
    ASSERT_EQ(std::system(
                  (path + "logrotate -f -s " + dir.file("state") + " " + dir.file("conf")).c_str()),
              0);
    EXPECT_TRUE(std::filesystem::exists(dir.file("home/var/log/tallyd.log.1")));
    EXPECT_EQ(end(SIGTERM), kEndedWell);
    EXPECT_THAT(log("tallyd.log"), ElementsAre("[Main Thread] INFO  counters: loaded 0 counts",
                                               "[Main Thread] INFO  tallyd: korvexd started",
                                               "[Main Thread] INFO  tallyd: ending by signal 15",
                                               "[Main Thread] INFO  tallyd: ended"));
}

}  // namespace
