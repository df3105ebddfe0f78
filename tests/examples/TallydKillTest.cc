#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <string>

#include "examples/RunningTallyd.h"
#include "support/Sweep.h"

namespace {

using testing::Contains;
using testsupport::TallydTest;

TEST_F(TallydTest, AKilledDaemonLosesOnlyWhatItHadNotSaved) {
    ASSERT_EQ(start().status, 0);
    for (int n = 0; n < 3; ++n)
        send("apple");
    eventually([this] { return signal(SIGHUP), saved("apple") == "3"; });
    send("apple");
    EXPECT_EQ(WTERMSIG(end(SIGKILL)), SIGKILL);
    EXPECT_EQ(saved("apple"), "3");
    EXPECT_NE(pid(), 0) << "the dead process's, which keeps nobody from starting";

    ASSERT_EQ(start().status, 0);
    EXPECT_THAT(log("tallyd.log"), Contains("[Main Thread] INFO  counters: loaded 1 counts"));
    send("apple");
    EXPECT_EQ(end(SIGTERM), 0);
    EXPECT_EQ(saved("apple"), "4");
}

TEST_F(TallydTest, AKillAtAnyMomentOfSavingLeavesAWholeFile) {
    ASSERT_EQ(start().status, 0);
    send("apple");
    EXPECT_EQ(end(SIGTERM), 0);
    unsigned long before = 1;
    unsigned long sent = 1;
    for (unsigned round = 0; round < 10 * testsupport::testScale(); ++round) {
        ASSERT_EQ(start().status, 0);
        for (unsigned n = 0; n < 20 + round % 10; ++n) {
            send("apple");
            ++sent;
            signal(SIGHUP);
            usleep(500 + round * 37 % 500);
        }
        EXPECT_EQ(WTERMSIG(end(SIGKILL)), SIGKILL);
        EXPECT_EQ(records({"check"}).status, 0);
        const unsigned long now = std::stoul(saved("apple"));
        EXPECT_GE(now, before);
        EXPECT_LE(now, sent);
        before = now;
    }
    EXPECT_GT(before, 1U) << "no save was ever finished";
}

}  // namespace
