#include <korvex/util/Thread.h>

#include <gmock/gmock.h>

#include <atomic>
#include <new>
#include <string>

#include "support/Child.h"
#include "support/Sweep.h"

namespace {

using testing::UnorderedElementsAre;
using testsupport::Call;
using testsupport::ownStderr;
using testsupport::sweep;
using testsupport::SweptFault;

std::atomic<int> runs{0};

class Worker : public Thread {
  public:
    Worker() : Thread("worker") {}

  private:
    void main() override { ++runs; }
};

// Whether it ran.
bool startAndJoin() {
    const int before = runs;
    Worker worker;
    worker.go();
    worker.join();
    return runs == before + 1;
}

TEST(ThreadSweep, AThreadRunsOrItsConstructorThrowsAndTheNextOneRuns) {
    const auto swept = sweep("thread",
                             {Call::pthread_create, Call::pthread_key_create,
                              Call::pthread_setspecific, Call::pthread_cond_init, Call::allocation},
                             [](SweptFault& fault) {
                                 Thread mainThread;
                                 bool ran = false;
                                 bool threw = false;
                                 fault.arm();
                                 try {
                                     ran = startAndJoin();
                                 } catch (const PthreadException&) {
                                     threw = true;
                                 } catch (const std::bad_alloc&) {
                                     threw = true;
                                 }
                                 fault.disarm();
                                 EXPECT_NE(ran, threw);
                                 EXPECT_TRUE(startAndJoin());
                             });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::pthread_create, Call::pthread_key_create,
                                                  Call::pthread_setspecific,
                                                  Call::pthread_cond_init, Call::allocation));
}

TEST(ThreadSweep, TheMainThreadObjectIsMadeOrThrows) {
    const auto swept = sweep("main thread",
                             {Call::pthread_attr_init, Call::pthread_attr_setstacksize,
                              Call::pthread_cond_init, Call::allocation},
                             [](SweptFault& fault) {
                                 fault.arm();
                                 try {
                                     const Thread mainThread;
                                 } catch (const PthreadException&) {
                                 } catch (const std::bad_alloc&) {
                                 }
                                 fault.disarm();
                             });
    EXPECT_THAT(swept.fired,
                UnorderedElementsAre(Call::pthread_attr_init, Call::pthread_attr_setstacksize,
                                     Call::pthread_cond_init, Call::allocation));
}

}  // namespace
