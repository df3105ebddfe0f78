#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <gmock/gmock.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <functional>
#include <memory>
#include <new>
#include <string>
#include <thread>
#include <vector>

#include "support/Child.h"
#include "support/Faults.h"
#include "util/Thread/ActiveThreads.h"

// There is one main-thread object a process, so each test makes its own in a child.

namespace {

using testing::MatchesRegex;
using testsupport::Call;
using testsupport::ChildResult;
using testsupport::CountCalls;
using testsupport::FailNth;
using testsupport::runInChild;

class Worker : public Thread {
  public:
    explicit Worker(
        const char* name, std::function<void()> body = [] {})
        : Thread(name), _body(std::move(body)) {}

  private:
    void main() override { _body(); }

    const std::function<void()> _body;
};

std::string assertion(const std::string& condition) {
    return "src/util/Thread.*:[0-9]+: failed assertion `" + condition + "'\n";
}

// The child's exit status: 0 when body returned true.
ChildResult child(const std::function<bool()>& body) {
    return runInChild([&] { return body() ? 0 : 1; });
}

TEST(ThreadTest, AWorkerBeforeTheMainThreadThrows) {
    const ChildResult result = child([] {
        try {
            Worker worker("early");
        } catch (const PthreadException& e) {
            return std::string(e.what()) == "Thread created before main thread!";
        }
        return false;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(ThreadTest, ASecondMainThreadThrows) {
    const ChildResult result = child([] {
        const Thread mainThread;
        try {
            const Thread second;
        } catch (const PthreadException& e) {
            return std::string(e.what()) == "Main Thread created twice!";
        }
        return false;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(ThreadTest, TheMainThreadHasANameButNoObject) {
    EXPECT_EQ(child([] {
                  const bool before = std::string(Thread::currentName()) == "Main Thread";
                  const Thread mainThread;
                  return before && std::string(mainThread.name()) == "Main Thread" &&
                         mainThread.isCurrent() && Thread::current() == nullptr &&
                         std::string(Thread::currentName()) == "Main Thread";
              }).status,
              0);
}

TEST(ThreadTest, AWorkerKnowsItself) {
    EXPECT_EQ(child([] {
                  const Thread mainThread;
                  std::string name;
                  const Thread* current = nullptr;
                  bool isCurrent = false;
                  Worker* self = nullptr;
                  Worker worker("the worker", [&] {
                      name = Thread::currentName();
                      current = Thread::current();
                      isCurrent = self->isCurrent();
                  });
                  self = &worker;
                  worker.go();
                  worker.join();
                  return name == "the worker" && current == &worker && isCurrent &&
                         !worker.isCurrent() && !(worker == mainThread) && worker == worker &&
                         std::string(worker.name()) == "the worker";
              }).status,
              0);
}

TEST(ThreadTest, NothingRunsBeforeGo) {
    EXPECT_EQ(child([] {
                  const Thread mainThread;
                  std::atomic<bool> ran{false};
                  Worker gated("gated", [&] { ran = true; });
                  Worker other("other");
                  other.go();
                  other.join();
                  const bool early = ran;
                  gated.go();
                  gated.join();
                  return !early && ran;
              }).status,
              0);
}

TEST(ThreadTest, AThreadWithoutWorkOfItsOwnEndsAtOnce) {
    EXPECT_EQ(child([] {
                  const Thread mainThread;
                  Thread idle("idle");
                  idle.go();
                  idle.join();
                  return true;
              }).status,
              0);
}

TEST(ThreadTest, AThreadThatCannotBeRegisteredSaysSoAndRuns) {
    for (const Call call : {Call::pthread_key_create, Call::pthread_setspecific}) {
        const ChildResult result = child([call] {
            const Thread mainThread;
            bool ran = false;
            const FailNth fault(call, 1, ENOMEM);
            Worker worker("w", [&ran] { ran = true; });
            worker.go();
            worker.join();
            return fault.fired() && ran;
        });
        EXPECT_EQ(result.status, 0) << result.signal;
        EXPECT_THAT(result.err,
                    testing::HasSubstr("Could not construct ThreadSpecificPointer<Thread> in "
                                       "ActiveThreads::add\n"));
    }
}

TEST(ThreadTest, RegisteringAThreadTwiceIsAnAssertion) {
    const ChildResult result = child([] {
        const Thread mainThread;
        Worker worker("w", [] { ActiveThreads::add(*ActiveThreads::current()); });
        worker.go();
        worker.join();
        return true;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, MatchesRegex(assertion("_ptrs->get\\(\\) == NULL")));
}

TEST(ThreadTest, GoTwiceIsAnAssertion) {
    const ChildResult result = child([] {
        const Thread mainThread;
        Worker worker("w");
        worker.go();
        worker.go();
        return true;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, MatchesRegex(assertion("!_ready_to_run")));
}

TEST(ThreadTest, JoinTwiceIsAnAssertion) {
    const ChildResult result = child([] {
        const Thread mainThread;
        Worker worker("w");
        worker.go();
        worker.join();
        worker.join();
        return true;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, MatchesRegex(assertion("!_did_join")));
}

TEST(ThreadTest, TheMainThreadsObjectIsBornReadyAndJoined) {
    EXPECT_THAT(child([] {
                    Thread mainThread;
                    mainThread.go();
                    return true;
                }).err,
                MatchesRegex(assertion("!_ready_to_run")));
    EXPECT_THAT(child([] {
                    Thread mainThread;
                    mainThread.join();
                    return true;
                }).err,
                MatchesRegex(assertion("!_did_join")));
}

TEST(ThreadTest, DestroyingAnUnjoinedThreadIsAnAssertion) {
    const ChildResult result = child([] {
        const Thread mainThread;
        const Worker worker("w");
        return true;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, MatchesRegex(assertion("_did_join \\|\\| !checkThreadErrors")));
}

TEST(ThreadTest, OnceTheMainThreadIsDyingAGatedWorkerMayBeAbandoned) {
    const ChildResult result = child([] {
        const Thread mainThread;
        std::atomic<int> ran{0};
        Thread::mainThreadDying();
        for (int i = 0; i < 100; ++i)
            Worker("abandoned", [&] { ++ran; });
        return ran == 0;
    });
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.err, "");
}

TEST(ThreadTest, AWorkerThatOutlivesItsObjectKeepsItsName) {
    const ChildResult result = child([] {
        const Thread mainThread;
        std::atomic<bool> gone{false};
        std::atomic<int> seen{0};
        std::atomic<bool> running{false};
        // Not of Worker's, whose members go with the object.
        static std::function<void()> body;
        body = [&] {
            running = true;
            while (!gone) {
            }
            seen =
                Thread::current() == nullptr && std::string(Thread::currentName()) == "w" ? 1 : 2;
        };
        struct Outliving : Thread {
            Outliving() : Thread("w") {}
            void main() override { body(); }
        };
        auto worker = std::make_unique<Outliving>();
        worker->go();
        while (!running) {
        }
        Thread::mainThreadDying();
        worker.reset();
        gone = true;
        while (seen == 0) {
        }
        return seen == 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

TEST(ThreadTest, AnAbandonedGateIsNotPassedEvenWhenItWasOpened) {
    const ChildResult result = child([] {
        const Thread mainThread;
        bool passed = true;
        Worker worker("w", [&] {
            auto& gate = *ActiveThreads::current();  // go() has opened it
            gate.abandon();
            passed = gate.pass() != nullptr || Thread::current() != nullptr;
        });
        worker.go();
        worker.join();
        return !passed;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

// The clean-up of thread-specific data, in whatever order, finds the name or "Main Thread".
TEST(ThreadTest, AnEndingThreadWithoutAnObjectMayStillAskForItsName) {
    const ChildResult result = child([] {
        const Thread mainThread;
        static std::atomic<int> asked{0};
        pthread_key_t keys[2];
        const auto ask = [](void*) {
            const std::string name = Thread::currentName();
            if (Thread::current() == nullptr && (name == "w" || name == "Main Thread")) ++asked;
        };
        pthread_key_create(&keys[0], ask);
        static std::atomic<bool> gone{false};
        static std::atomic<bool> running{false};
        static pthread_key_t* specific = keys;
        struct Outliving : Thread {
            Outliving() : Thread("w") {}
            void main() override {
                for (int i = 0; i < 2; ++i)
                    pthread_setspecific(specific[i], this);
                running = true;
                while (!gone) {
                }
            }
        };
        auto worker = std::make_unique<Outliving>();
        pthread_key_create(&keys[1], ask);
        worker->go();
        while (!running) {
        }
        Thread::mainThreadDying();
        worker.reset();
        gone = true;
        while (asked < 2) {
        }
        return true;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

TEST(ThreadTest, AThreadThatCannotBeCreatedThrows) {
    const ChildResult result = child([] {
        const Thread mainThread;
        const FailNth fault(Call::pthread_create, 1, EAGAIN);
        try {
            Worker worker("w");
        } catch (const PthreadException& e) {
            return std::string(e.what()) ==
                   "Main Thread: about to throw a PthreadException: pthread_create: Resource "
                   "temporarily unavailable";
        }
        return false;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.err, "");
}

TEST(ThreadTest, WithCheckingOffAThreadThatWasNeverCreatedIsJoinedQuietly) {
    const ChildResult result = child([] {
        const Thread mainThread;
        Thread::mainThreadDying();
        const FailNth fault(Call::pthread_create, 1, EAGAIN, FailNth::FROM_THEN_ON);
        const CountCalls joins(Call::pthread_join);
        Worker joined("w");
        joined.join();
        Worker unjoined("w");
        return joins.count() == 0;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(ThreadTest, AFailingJoinIsChecked) {
    const ChildResult result = child([] {
        const Thread mainThread;
        Worker worker("w");
        worker.go();
        const FailNth fault(Call::pthread_join, 1, EDEADLK);
        try {
            worker.join();
        } catch (const PthreadException&) {
            return true;
        }
        return false;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err,
              "Main Thread: about to throw a PthreadException: pthread_join: Resource "
              "deadlock avoided\n");
}

TEST(ThreadTest, AStackSizeThatCannotBeSetIsAWarning) {
    const ChildResult result = child([] {
        const FailNth fault(Call::pthread_attr_setstacksize, 1, EINVAL);
        const Thread mainThread;
        Worker worker("w");
        worker.go();
        worker.join();
        return true;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err,
              "cannot override thread stack size: pthread_attr_setstacksize(): Invalid "
              "argument\n");
}

TEST(ThreadTest, FailingAttributesAreChecked) {
    const ChildResult result = child([] {
        const FailNth fault(Call::pthread_attr_init, 1, ENOMEM);
        try {
            const Thread mainThread;
        } catch (const PthreadException&) {
            return true;
        }
        return false;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err,
              "Main Thread: about to throw a PthreadException: pthread_attr_init: Cannot "
              "allocate memory\n");
}

TEST(ThreadTest, AWorkerHasAStackOfOneMebibyte) {
    EXPECT_EQ(child([] {
                  const Thread mainThread;
                  std::size_t size = 0;
                  Worker worker("w", [&] {
                      pthread_attr_t attr;
                      pthread_getattr_np(pthread_self(), &attr);
                      pthread_attr_getstacksize(&attr, &size);
                      pthread_attr_destroy(&attr);
                  });
                  worker.go();
                  worker.join();
                  return size == 1048576;
              }).status,
              0);
}

TEST(ThreadTest, AfterTheLastWorkerTheNextOneRegistersAfresh) {
    const ChildResult result = child([] {
        const Thread mainThread;
        const CountCalls keys(Call::pthread_key_create);
        for (int i = 0; i < 3; ++i) {
            bool known = false;
            Worker worker("w", [&] { known = Thread::current() != nullptr; });
            worker.go();
            worker.join();
            if (!known) return false;
        }
        return keys.count() == 3;
    });
    EXPECT_EQ(result.status, 0) << result.err;
}

TEST(ThreadTest, AThreadNotMadeHereIsTheMainThreadByName) {
    EXPECT_EQ(child([] {
                  const Thread mainThread;
                  bool ok = false;
                  std::thread([&] {
                      ok = Thread::current() == nullptr &&
                           std::string(Thread::currentName()) == "Main Thread";
                  }).join();
                  return ok;
              }).status,
              0);
}

TEST(ThreadTest, ThousandsOfShortThreadsComeAndGoWhileOthersAsk) {
    const ChildResult result = runInChild(
        [] {
            const Thread mainThread;
            std::atomic<bool> stop{false};
            std::thread asker([&] {
                while (!stop) {
                    if (Thread::current() != nullptr) std::abort();
                }
            });
            std::vector<std::thread> makers;
            std::atomic<int> ran{0};
            for (int m = 0; m < 3; ++m) {
                makers.emplace_back([&] {
                    for (int i = 0; i < 1000; ++i) {
                        Worker worker("short", [&] {
                            if (std::string(Thread::currentName()) == "short") ++ran;
                        });
                        worker.go();
                        worker.join();
                    }
                });
            }
            for (std::thread& maker : makers)
                maker.join();
            stop = true;
            asker.join();
            return ran == 3000 ? 0 : 1;
        },
        110);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.err, "");
}

// The registry's key and this one are cleaned up in either order when a thread ends.
TEST(ThreadTest, AnEndingThreadMayStillLogAndAskForItsName) {
    const ChildResult result = child([] {
        static Logger logger("ending");
        const Thread mainThread;
        Logger::initialize();
        TSP_Implementor slot([](void*) {
            logger.warn("ending");
            if (Thread::currentName() == nullptr) std::abort();
        });
        for (int i = 0; i < 3; ++i) {
            Worker worker("w", [&] { slot.set(&slot); });
            worker.go();
            worker.join();
        }
        return true;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "ending\nending\nending\n");
}

class Note : public InThreadActor {
  public:
    Note(std::vector<int>& notes, int n) : _notes(notes), _n(n) {}
    void callback() override { _notes.push_back(_n); }

  private:
    std::vector<int>& _notes;
    const int _n;
};

TEST(InThreadActorQueueTest, RunsInOrderOnTheOwnersThread) {
    InThreadActorQueue queue;
    std::vector<int> notes;
    Note one(notes, 1);
    Note two(notes, 2);
    EXPECT_FALSE(queue.waitForWork(0));
    EXPECT_EQ(queue.runQueued(), 0U);
    queue.submit(one);
    queue.submit(two);
    EXPECT_TRUE(queue.waitForWork(0));
    EXPECT_THAT(notes, testing::IsEmpty());
    EXPECT_EQ(queue.runQueued(), 2U);
    EXPECT_THAT(notes, testing::ElementsAre(1, 2));
    queue.submit(one);
    EXPECT_EQ(queue.runQueued(), 1U) << "an actor may be submitted again";
}

TEST(InThreadActorQueueTest, WhatCallbacksAddStaysForTheNextCall) {
    struct Again : InThreadActor {
        explicit Again(InThreadActorQueue& to) : queue(to) {}
        void callback() override {
            ++ran;
            queue.submit(*this);
        }
        InThreadActorQueue& queue;
        int ran = 0;
    };
    InThreadActorQueue queue;
    Again again(queue);
    queue.submit(again);
    EXPECT_EQ(queue.runQueued(), 1U);
    EXPECT_EQ(again.ran, 1);
    EXPECT_EQ(queue.runQueued(), 1U);
    EXPECT_EQ(again.ran, 2);
}

TEST(InThreadActorQueueTest, SubmittingWhatIsQueuedAlreadyIsAnAssertion) {
    const ChildResult result = child([] {
        InThreadActorQueue queue;
        std::vector<int> notes;
        Note note(notes, 1);
        queue.submit(note);
        queue.submit(note);
        return true;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, MatchesRegex(assertion("!actor._queued")));
}

TEST(InThreadActorQueueTest, AWakeUpWithoutCauseDoesNotBeginTheTimeAnew) {
    InThreadActorQueue queue;
    const testsupport::ShortNth wake(Call::pthread_cond_clockwait, 1, 0);
    EXPECT_FALSE(queue.waitForWork(1));
    EXPECT_EQ(wake.count(), 2U);
    EXPECT_EQ(testsupport::deadlines[0].tv_sec, testsupport::deadlines[1].tv_sec);
    EXPECT_EQ(testsupport::deadlines[0].tv_nsec, testsupport::deadlines[1].tv_nsec);
    EXPECT_GT(testsupport::deadlines[0].tv_nsec + testsupport::deadlines[0].tv_sec, 0);
}

TEST(InThreadActorQueueTest, ASubmitterMayWait) {
    InThreadActorQueue queue;
    std::vector<int> notes;
    std::thread owner([&] {
        std::size_t ran = 0;
        while (ran < 100) {
            queue.waitForWork(60);
            ran += queue.runQueued();
        }
    });
    for (int i = 0; i < 100; ++i) {
        Note note(notes, i);
        queue.submitAndWait(note);
        ASSERT_EQ(notes.size(), static_cast<std::size_t>(i) + 1);
    }
    owner.join();
}

TEST(InThreadActorQueueTest, AnActorThatWasWaitedForOnceMayDestroyItselfLater) {
    constexpr unsigned char kDead = 0x5A;
    struct Leaving : InThreadActor {
        void callback() override {
            if (!leaves) return;
            this->~Leaving();
            std::memset(static_cast<void*>(this), kDead, sizeof *this);
        }
        bool leaves = false;
    };
    alignas(Leaving) unsigned char place[sizeof(Leaving)];
    auto* const actor = new (place) Leaving;
    InThreadActorQueue queue;
    std::thread submitter([&] { queue.submitAndWait(*actor); });
    while (queue.runQueued() == 0)
        queue.waitForWork(60);
    submitter.join();
    actor->leaves = true;
    queue.submit(*actor);
    EXPECT_EQ(queue.runQueued(), 1U);
    EXPECT_THAT(place, testing::Each(kDead));
}

TEST(InThreadActorQueueTest, AThrowingCallbackComesThroughAndTheRestStays) {
    struct Thrower : InThreadActor {
        void callback() override { throw std::runtime_error("x"); }
    };
    InThreadActorQueue queue;
    std::vector<int> notes;
    Thrower thrower;
    Note note(notes, 1);
    queue.submit(thrower);
    queue.submit(note);
    EXPECT_THROW(queue.runQueued(), std::runtime_error);
    EXPECT_EQ(queue.runQueued(), 1U);
    EXPECT_THAT(notes, testing::ElementsAre(1));
}

TEST(InThreadActorQueueTest, AJoinHelperJoinsAndDeletesItsThread) {
    const ChildResult result = child([] {
        const Thread mainThread;
        InThreadActorQueue queue;
        static int deaths = 0;
        struct Leaving : Thread {
            explicit Leaving(InThreadActorQueue& q) : Thread("leaving"), queue(q) {}
            Leaving(const Leaving&) = delete;
            Leaving& operator=(const Leaving&) = delete;
            ~Leaving() override { ++deaths; }
            void main() override { queue.submit(joinHelper()); }
            InThreadActorQueue& queue;
        };
        for (int i = 0; i < 10; ++i)
            (new Leaving(queue))->go();
        while (deaths < 10) {
            queue.waitForWork(60);
            queue.runQueued();
        }
        return deaths == 10;
    });
    EXPECT_EQ(result.status, 0) << result.err;
}

TEST(InThreadActorQueueTest, AJoinHelperWithoutAThreadDoesNothing) {
    Thread::JoinHelper helper(nullptr);
    helper.callback();
}

}  // namespace
