#include <korvex/util/Thread.h>

#include <atomic>
#include <memory>

#include "scenarios/Parallel.h"
#include "scenarios/Workers.h"

#include "explorer/Scenario.h"

// The gate at which a new thread waits for go().

namespace schedules {

namespace {

void opened() {
    const Thread mainThread;
    std::atomic<int> ran{0};
    bool released = false;
    Worker worker("gated", [&] {
        require(released, "main() runs before go()");
        ++ran;
    });
    released = true;
    worker.go();
    worker.join();
    require(ran == 1, "main() has not run just once");
}

void twoOpened() {
    const Thread mainThread;
    std::atomic<int> ran{0};
    Worker one("one", [&] { ++ran; });
    Worker two("two", [&] { ++ran; });
    Parallel threads{[&] { one.go(); }};
    two.go();
    two.join();
    threads.join();
    one.join();
    require(ran == 2, "not both main()s have run");
}

// Never opened: the thread goes home without running main().
void abandoned() {
    const Thread mainThread;
    auto worker = std::make_unique<Worker>("abandoned", [] { require(false, "main() has run"); });
    Thread::mainThreadDying();
    worker.reset();
    waitForTheOthers();
}

// Its object goes while the thread may be on its way from the gate to main(): too early, as nobody
// but the program can see to it that main() has begun.
class Bystander : public Thread {
  public:
    Bystander() : Thread("bystander") {}

  private:
    void main() override {}
};

void openedAndAbandoned() {
    const Thread mainThread;
    auto thread = std::make_unique<Bystander>();
    Thread::mainThreadDying();
    thread->go();
    thread.reset();
    waitForTheOthers();
}

void joinedByAnother() {
    const Thread mainThread;
    InThreadActorQueue queue;
    auto worker = std::make_unique<Worker>("leaving", [] {});
    Worker* const leaving = worker.release();
    Parallel threads{[&] {
        leaving->go();
        queue.submit(leaving->joinHelper());
    }};
    while (queue.runQueued() == 0)
        queue.waitForWork(1);
    threads.join();
    waitForTheOthers();
}

const Register registered{
    {"gate-opened", &opened},
    {"gate-two-opened", &twoOpened},
    {"gate-abandoned", &abandoned},
    {"known-gate-opened-and-abandoned", &openedAndAbandoned, nullptr, "data race", 1},
    {"gate-joined-by-another", &joinedByAnother},
};

}  // namespace

}  // namespace schedules
