#include <korvex/util/JoiningThread.h>

#include <gmock/gmock.h>

#include <csignal>
#include <mutex>
#include <string>

#include "support/Child.h"

namespace {

using testsupport::ChildResult;
using testsupport::runInChild;

TEST(JoiningThreadTest, RunsAtOnceAndIsJoinedAtTheEndOfTheScope) {
    EXPECT_EQ(runInChild([] {
                  const Thread mainThread;
                  std::string seen;
                  {
                      const JoiningThread worker("w", [&] { seen = Thread::currentName(); });
                      if (std::string(worker.thread().name()) != "w") return 1;
                  }
                  return seen == "w" ? 0 : 2;
              }).status,
              0);
}

TEST(JoiningThreadTest, MayBeJoinedOnceByHand) {
    EXPECT_EQ(runInChild([] {
                  const Thread mainThread;
                  bool ran = false;
                  JoiningThread worker("w", [&] { ran = true; });
                  worker.join();
                  return ran ? 0 : 1;
              }).status,
              0);
    const ChildResult twice = runInChild([] {
        const Thread mainThread;
        JoiningThread worker("w", [] {});
        worker.join();
        worker.join();
        return 0;
    });
    EXPECT_EQ(twice.signal, SIGABRT);
    EXPECT_THAT(twice.err, testing::HasSubstr("failed assertion `!_did_join'"));
}

TEST(JoiningThreadTest, BeforeTheMainThreadItThrows) {
    EXPECT_EQ(runInChild([] {
                  try {
                      const JoiningThread worker("w", [] {});
                  } catch (const PthreadException& e) {
                      return std::string(e.what()) == "Thread created before main thread!" ? 0 : 1;
                  }
                  return 2;
              }).status,
              0);
}

TEST(MutexTest, TheStandardsGuardsTakeIt) {
    Mutex a;
    Mutex b;
    {
        const std::lock_guard<Mutex> guard(a);
        EXPECT_FALSE(b.try_lock() && a.try_lock());
        b.unlock();
    }
    { const std::scoped_lock both(a, b); }
    std::unique_lock<Mutex> lock(a, std::try_to_lock);
    EXPECT_TRUE(lock.owns_lock());
    lock.unlock();
    EXPECT_TRUE(a.try_lock());
    a.unlock();
}

}  // namespace
