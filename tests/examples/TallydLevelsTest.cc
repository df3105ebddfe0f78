#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <string>
#include <vector>

#include "examples/RunningTallyd.h"

namespace {

using testing::Contains;
using testing::Not;
using testsupport::TallydTest;
using testsupport::writeFile;

const std::string kWarning = "[Main Thread] WARN  tallyd: ";

class TallydLevelsTest : public TallydTest {
  protected:
    // Sends the signal and waits until the log has one line more.
    void signalAndWait() const {
        const std::size_t before = log("tallyd.log").size();
        signal(SIGUSR1);
        eventually([&] { return log("tallyd.log").size() > before; });
    }
    void setLevels(const std::string& text) const {
        writeFile(file, text);
        signalAndWait();
    }
    // What the log of the channel has of this name once the name after it is counted.
    bool logsCounting(const std::string& name) const {
        send(name);
        send("no name");  // refused, which is always logged
        const std::string end = "WARN  refused 7 bytes";
        const auto refusals = [&] {
            const auto lines = log("receiver.log");
            return std::count(lines.begin(), lines.end(), end);
        };
        const auto expected = ++_refused;
        eventually([&] { return refusals() == expected; });
        const auto lines = log("receiver.log");
        return std::count(lines.begin(), lines.end(), "DEBUG counted " + name) == 1;
    }

    const std::string file = dir.file("db/tallyd.levels");

  private:
    mutable long _refused = 0;
};

TEST_F(TallydLevelsTest, ASignalSetsTheLevelsThatTheFileSays) {
    ASSERT_EQ(start().status, 0);
    EXPECT_FALSE(logsCounting("apple"));
    setLevels("receiver DEBUG\n");
    EXPECT_THAT(log("tallyd.log"), Contains(kWarning + "the level of receiver is DEBUG now"));
    EXPECT_TRUE(logsCounting("pear"));
    setLevels("receiver INFO\n");
    EXPECT_FALSE(logsCounting("plum"));
    EXPECT_EQ(end(SIGTERM), 0);
    EXPECT_EQ(saved("pear"), "1");
}

TEST_F(TallydLevelsTest, TheRootIsAStarAndSeveralLinesCount) {
    ASSERT_EQ(start().status, 0);
    writeFile(file, "\n* ERROR\ncounters WARN\nreceiver DEBUG\n");
    signal(SIGUSR1);
    const std::string last = kWarning + "the level of receiver is DEBUG now";
    eventually([&] { return !log("tallyd.log").empty() && log("tallyd.log").back() == last; });
    EXPECT_THAT(log("tallyd.log"), Contains(kWarning + "the level of * is ERROR now"));
    EXPECT_THAT(log("tallyd.log"), Contains(kWarning + "the level of counters is WARN now"));
    send("apple");
    EXPECT_EQ(end(SIGTERM), 0);
    EXPECT_EQ(saved("apple"), "1");
    EXPECT_THAT(log("tallyd.log"),
                Not(Contains("[Main Thread] INFO  counters: saved 1 changed counts")));
}

TEST_F(TallydLevelsTest, WhatIsNoLevelOrNoCategoryIsRefused) {
    ASSERT_EQ(start().status, 0);
    setLevels("receiver debug\n");
    EXPECT_EQ(log("tallyd.log").back(), kWarning + "no level debug for receiver");
    setLevels("nobody DEBUG\n");
    EXPECT_EQ(log("tallyd.log").back(), kWarning + "no category nobody in the configuration");
    EXPECT_FALSE(logsCounting("apple"));
}

TEST_F(TallydLevelsTest, AFileThatOthersMayWriteIsRefused) {
    ASSERT_EQ(start().status, 0);
    writeFile(file, "receiver DEBUG\n");
    const std::string refusal =
        kWarning + file + " is refused: others may write to it, or it is no file";
    for (const mode_t mode : {0620, 0602}) {
        ASSERT_EQ(chmod(file.c_str(), mode), 0);
        signalAndWait();
        EXPECT_EQ(log("tallyd.log").back(), refusal);
    }
    EXPECT_FALSE(logsCounting("apple"));
    ASSERT_EQ(chmod(file.c_str(), 0644), 0);
    if (geteuid() == 0) {  // who else could give a file away?
        ASSERT_EQ(chown(file.c_str(), 12345, 0), 0);
        signalAndWait();
        EXPECT_EQ(log("tallyd.log").back(), refusal);
        ASSERT_EQ(chown(file.c_str(), 0, 0), 0);
    }
    signalAndWait();
    EXPECT_TRUE(logsCounting("pear"));
}

TEST_F(TallydLevelsTest, ALinkAFifoAndNoFileAreRefused) {
    ASSERT_EQ(start().status, 0);
    signalAndWait();
    EXPECT_EQ(log("tallyd.log").back(),
              kWarning + "cannot read " + file + ": No such file or directory");
    writeFile(dir.file("elsewhere"), "receiver DEBUG\n");
    ASSERT_EQ(symlink(dir.file("elsewhere").c_str(), file.c_str()), 0);
    signalAndWait();
    EXPECT_EQ(log("tallyd.log").back(),
              kWarning + "cannot read " + file + ": Too many levels of symbolic links");
    ASSERT_EQ(unlink(file.c_str()), 0);
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    signalAndWait();
    EXPECT_EQ(log("tallyd.log").back(),
              kWarning + file + " is refused: others may write to it, or it is no file");
    EXPECT_FALSE(logsCounting("apple"));
}

}  // namespace
