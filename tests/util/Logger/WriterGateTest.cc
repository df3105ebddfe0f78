#include "util/Logger/WriterGate.h"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <thread>

inline namespace korvex {

TEST(WriterGateTest, IsShutAtFirst) {
    WriterGate gate;
    EXPECT_FALSE(gate.enter());
}

TEST(WriterGateTest, LetsAnyNumberInWhileItIsOpen) {
    WriterGate gate;
    gate.open();
    EXPECT_TRUE(gate.enter());
    EXPECT_TRUE(gate.enter());
    gate.leave();
    gate.leave();
}

TEST(WriterGateTest, MayBeShutTwice) {
    WriterGate gate;
    gate.open();
    gate.shut();
    gate.shut();
    EXPECT_FALSE(gate.enter());
    gate.open();
    EXPECT_TRUE(gate.enter());
    gate.leave();
}

TEST(WriterGateTest, ShuttingWaitsForAllInsideAndLetsNobodyElseIn) {
    WriterGate gate;
    gate.open();
    ASSERT_TRUE(gate.enter());
    ASSERT_TRUE(gate.enter());
    std::atomic<bool> shut{false};
    std::thread shutter([&] {
        gate.shut();
        shut = true;
    });
    while (gate.enter())  // until the thread has begun to shut it
        gate.leave();
    EXPECT_FALSE(shut);
    gate.leave();
    EXPECT_FALSE(shut);
    gate.leave();
    shutter.join();
    EXPECT_FALSE(gate.enter());
}

// As a thread does that forks, and whose cancellation was asked for.
TEST(WriterGateTest, ShuttingIsNoPointAtWhichAThreadIsCancelled) {
    WriterGate gate;
    gate.open();
    ASSERT_TRUE(gate.enter());
    std::atomic<bool> shut{false};
    std::thread shutter([&] {
        pthread_cancel(pthread_self());
        gate.shut();
        shut = true;
        pthread_setcancelstate(PTHREAD_CANCEL_DISABLE, nullptr);  // std::thread cannot be cancelled
    });
    while (gate.enter())
        gate.leave();
    gate.leave();
    shutter.join();
    EXPECT_TRUE(shut);
}

// Who is turned away, all the time, must leave nothing behind that the child would wait for.
TEST(WriterGateTest, AChildOfAForkFindsItUsableIfItWasShut) {
    WriterGate gate;
    gate.open();
    std::atomic<bool> done{false};
    std::thread writer([&] {
        while (!done) {
            if (gate.enter()) gate.leave();
        }
    });
    for (int i = 0; i < 200; ++i) {
        gate.shut();
        const pid_t child = fork();
        if (child == 0) {
            gate.open();
            const bool entered = gate.enter();
            gate.leave();
            gate.shut();
            _exit(entered ? 0 : 1);
        }
        gate.open();
        int status = -1;
        ASSERT_EQ(waitpid(child, &status, 0), child);
        EXPECT_EQ(status, 0);
    }
    done = true;
    writer.join();
}

TEST(WriterGateTest, AVisitLeavesAtTheEndOfItsScope) {
    WriterGate gate;
    gate.open();
    {
        const WriterGate::Visit visit(gate);
        EXPECT_TRUE(visit.inside());
    }
    gate.shut();  // would wait for ever
    const WriterGate::Visit visit(gate);
    EXPECT_FALSE(visit.inside());
}

}  // namespace korvex
