#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>
#include <korvex/util/ThreadObj.h>

#include <gmock/gmock.h>

#include <cerrno>
#include <csignal>
#include <string>
#include <thread>

#include "support/Child.h"
#include "support/Faults.h"

// Failures of the thread library log on standard error here, so they are looked at in children.

namespace {

using testsupport::Call;
using testsupport::ChildResult;
using testsupport::FailNth;
using testsupport::runInChild;

std::string warning(const std::string& call, const std::string& error) {
    return "Main Thread: about to throw a PthreadException: " + call + ": " + error;
}

// What `body` throws as a PthreadException in a child must be what it logs, and just that.
template <class Body>
void expectChecked(const char* call, const char* error, Body body) {
    const ChildResult checked = runInChild([&] {
        try {
            body();
        } catch (const PthreadException& e) {
            fputs(e.what(), stdout);
            return 3;
        }
        return 0;
    });
    EXPECT_EQ(checked.status, 3) << call;
    EXPECT_EQ(checked.out, warning(call, error));
    EXPECT_EQ(checked.err, warning(call, error) + "\n");
    const ChildResult unchecked = runInChild([&] {
        Thread::mainThreadDying();
        body();
        return 0;
    });
    EXPECT_EQ(unchecked.status, 0) << call;
    EXPECT_EQ(unchecked.err, "");
}

TEST(PthreadExceptionTest, CarriesItsMessage) {
    PthreadException e("message");
    const PthreadException copy(e);
    EXPECT_STREQ(copy.what(), "message");
    e = PthreadException("other");
    EXPECT_STREQ(e.what(), "other");
}

TEST(CheckPtResTest, SuccessIsNothing) {
    PthreadObject::checkPtRes("pthread_x", 0);
}

TEST(CheckPtResTest, AFailureIsLoggedAndThrownUntilTheProcessDies) {
    expectChecked("pthread_x", "Resource deadlock avoided", [] {
        errno = ENOENT;  // not the error's number
        PthreadObject::checkPtRes("pthread_x", EDEADLK);
    });
}

TEST(PthreadTokenTest, IsTheThreadsOwn) {
    const PthreadToken mine = PthreadToken::self();
    EXPECT_TRUE(mine == PthreadToken::self());
    bool same = true;
    std::thread([&] { same = mine == PthreadToken::self(); }).join();
    EXPECT_FALSE(same);
}

TEST(MutexTest, TryLockTellsWhetherItWasFree) {
    Mutex mutex;
    const auto fromElsewhere = [&] {
        bool got = false;
        std::thread([&] {
            got = mutex.tryLock();
            if (got) mutex.unlock();
        }).join();
        return got;
    };
    EXPECT_TRUE(fromElsewhere());
    mutex.lock();
    EXPECT_FALSE(fromElsewhere());
    mutex.unlock();
    EXPECT_TRUE(fromElsewhere());
    EXPECT_TRUE(mutex.NOLOG_lock());
    EXPECT_FALSE(fromElsewhere());
    EXPECT_EQ(mutex.NOLOG_unlock(), 0);
    EXPECT_TRUE(fromElsewhere());
}

TEST(MutexTest, ABusyLockLogsNothing) {
    const ChildResult result = runInChild([] {
        Mutex mutex;
        mutex.lock();
        bool got = true;
        std::thread([&] { got = mutex.tryLock(); }).join();
        mutex.unlock();
        return got ? 1 : 0;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(MutexTest, EveryCallIsChecked) {
    expectChecked("pthread_mutex_init", "Cannot allocate memory", [] {
        const FailNth fault(Call::pthread_mutex_init, 1, ENOMEM);
        const Mutex mutex;
    });
    expectChecked("pthread_mutex_lock", "Invalid argument", [] {
        Mutex mutex;
        const FailNth fault(Call::pthread_mutex_lock, 1, EINVAL);
        mutex.lock();
    });
    expectChecked("pthread_mutex_unlock", "Operation not permitted", [] {
        Mutex mutex;
        const FailNth fault(Call::pthread_mutex_unlock, 1, EPERM);
        mutex.unlock();
    });
    expectChecked("pthread_mutex_trylock", "Invalid argument", [] {
        Mutex mutex;
        const FailNth fault(Call::pthread_mutex_trylock, 1, EINVAL);
        if (mutex.tryLock()) fputs("locked", stdout);
    });
}

TEST(MutexTest, DestroyingALockedMutexThrows) {
    expectChecked("pthread_mutex_destroy", "Device or resource busy", [] {
        const FailNth fault(Call::pthread_mutex_destroy, 1, EBUSY);
        const Mutex mutex;
    });
}

TEST(MutexTest, TheQuietFormsNeverLogAndTellTheResult) {
    const ChildResult result = runInChild([] {
        Mutex mutex;
        const FailNth lock(Call::pthread_mutex_lock, 1, EINVAL);
        const FailNth unlock(Call::pthread_mutex_unlock, 1, EPERM);
        return !mutex.NOLOG_lock() && mutex.NOLOG_unlock() == EPERM ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(RecursiveMutexTest, NeedsAsManyUnlocksAsLocks) {
    RecursiveMutex mutex;
    const auto freeElsewhere = [&] {
        bool got = false;
        std::thread([&] {
            got = mutex.tryLock();
            if (got) mutex.unlock();
        }).join();
        return got;
    };
    mutex.lock();
    mutex.lock();
    EXPECT_TRUE(mutex.tryLock());
    for (int i = 0; i < 3; ++i) {
        EXPECT_FALSE(freeElsewhere()) << i;
        mutex.unlock();
    }
    EXPECT_TRUE(freeElsewhere());
    EXPECT_TRUE(mutex.tryLock());
    mutex.unlock();
}

TEST(RecursiveMutexTest, AWaiterGetsItAfterTheLastUnlock) {
    RecursiveMutex mutex;
    int value = 0;
    mutex.lock();
    mutex.lock();
    std::thread waiter([&] {
        mutex.lock();
        value *= 2;
        mutex.unlock();
    });
    value = 1;
    mutex.unlock();
    value = 21;
    mutex.unlock();
    waiter.join();
    mutex.lock();
    EXPECT_EQ(value, 42);
    mutex.unlock();
}

// Another thread let go of it between the two looks.
TEST(RecursiveMutexTest, ALockThatIsBusyWithoutAnOwnerIsWaitedFor) {
    RecursiveMutex mutex;
    {
        const FailNth busy(Call::pthread_mutex_trylock, 1, EBUSY);
        EXPECT_FALSE(mutex.tryLock());
    }
    {
        const FailNth busy(Call::pthread_mutex_trylock, 1, EBUSY);
        mutex.lock();
        EXPECT_TRUE(busy.fired());
    }
    EXPECT_TRUE(mutex.tryLock()) << "it is ours";
    mutex.unlock();
    mutex.unlock();
}

TEST(RecursiveMutexTest, UnlockingWhatNobodyHoldsIsAnAssertion) {
    const ChildResult result = runInChild([] {
        RecursiveMutex mutex;
        mutex.unlock();
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err, testing::MatchesRegex(
                                "src/util/Thread.*:[0-9]+: failed assertion `_owner_count > 0'\n"));
}

TEST(ScopedMutexTest, HoldsAndLetsGo) {
    Mutex mutex;
    {
        const ScopedMutex lock(mutex);
        EXPECT_FALSE(mutex.tryLock());
        {
            const ScopedMutexUnlocker unlocker(mutex);
            EXPECT_TRUE(mutex.tryLock());
            mutex.unlock();
        }
        EXPECT_FALSE(mutex.tryLock()) << "locked again";
    }
    EXPECT_TRUE(mutex.tryLock());
    mutex.unlock();
}

TEST(ScopedMutexTest, AFailingUnlockThrowsUnlessAnExceptionIsOnItsWay) {
    expectChecked("pthread_mutex_unlock", "Operation not permitted", [] {
        static Mutex& mutex = *new Mutex;  // it stays locked, so it is not destroyed
        const ScopedMutex lock(mutex);
        static const FailNth fault(Call::pthread_mutex_unlock, 1, EPERM);
    });
    const ChildResult result = runInChild([] {
        Mutex mutex;
        try {
            const ScopedMutex lock(mutex);
            static const FailNth fault(Call::pthread_mutex_unlock, 1, EPERM);
            throw 7;
        } catch (int n) {
            mutex.NOLOG_unlock();
            return n;
        }
    });
    EXPECT_EQ(result.status, 7);
}

TEST(ScopedMutexTest, AGuardBuiltDuringUnwindingStillThrows) {
    const ChildResult result = runInChild([] {
        struct WhileUnwinding {
            Mutex& mutex;
            ~WhileUnwinding() {
                try {
                    const ScopedMutex lock(mutex);
                    static const FailNth fault(Call::pthread_mutex_unlock, 1, EPERM);
                } catch (const PthreadException&) {
                    fputs("thrown", stdout);
                }
                mutex.NOLOG_unlock();
            }
        };
        Mutex mutex;
        try {
            const WhileUnwinding object{mutex};
            throw 7;
        } catch (int) {
        }
        return 0;
    });
    EXPECT_EQ(result.out, "thrown");
}

TEST(ConditionTest, AWaiterIsWoken) {
    Mutex mutex;
    ConditionWakeAll cond;
    int ready = 0;
    std::thread a([&] {
        ScopedMutex lock(mutex);
        while (ready == 0)
            cond.wait(lock);
    });
    std::thread b([&] {
        ScopedMutex lock(mutex);
        while (ready == 0)
            cond.wait(mutex, 60);
    });
    {
        const ScopedMutex lock(mutex);
        ready = 1;
        cond.wake_all();
    }
    a.join();
    b.join();
}

struct ConditionWakeOne : ConditionBaseClass {
    void wake_one() { internal_wake_one(); }
};

TEST(ConditionTest, OneWaiterIsWokenForEachCall) {
    Mutex mutex;
    ConditionWakeOne cond;
    int ready = 0;
    const auto wait = [&] {
        ScopedMutex lock(mutex);
        while (ready == 0)
            cond.wait(lock);
        --ready;
    };
    std::thread a(wait);
    std::thread b(wait);
    for (int i = 0; i < 2; ++i) {
        const ScopedMutex lock(mutex);
        ++ready;
        cond.wake_one();
    }
    a.join();
    b.join();
    EXPECT_EQ(ready, 0);
}

TEST(ConditionTest, ATimedWaitEndsWithFalse) {
    Mutex mutex;
    ConditionWakeAll cond;
    ScopedMutex lock(mutex);
    bool woken = true;
    for (int i = 0; i < 10 && woken; ++i)
        woken = cond.wait(lock, 0);  // it may wake without cause
    EXPECT_FALSE(woken);
    EXPECT_FALSE(mutex.tryLock()) << "the mutex is held again";
}

TEST(ConditionTest, ATimeOutIsNoFailureAndAnyOtherErrorIs) {
    expectChecked("pthread_cond_wait", "Invalid argument", [] {
        Mutex mutex;
        ConditionWakeAll cond;
        const ScopedMutex lock(mutex);
        const FailNth fault(Call::pthread_cond_wait, 1, EINVAL);
        cond.wait(mutex);
    });
    expectChecked("pthread_cond_timedwait_relative_np", "Operation not permitted", [] {
        Mutex mutex;
        ConditionWakeAll cond;
        const ScopedMutex lock(mutex);
        const FailNth fault(Call::pthread_cond_clockwait, 1, EPERM);
        if (cond.wait(mutex, 5)) fputs("woken", stdout);
    });
    expectChecked("pthread_cond_init", "Cannot allocate memory", [] {
        const FailNth fault(Call::pthread_cond_init, 1, ENOMEM);
        const ConditionWakeAll cond;
    });
}

int cleanups = 0;
void* lastCleaned = nullptr;
void countCleanup(void* p) {
    ++cleanups;
    lastCleaned = p;
}

TEST(ThreadSpecificTest, ReplacingCleansTheOldValueUp) {
    cleanups = 0;
    TSP_Implementor slot(&countCleanup);
    int a = 0;
    int b = 0;
    EXPECT_EQ(slot.get(), nullptr);
    slot.set(&a);
    slot.set(&a);
    EXPECT_EQ(cleanups, 0);
    slot.set(&b);
    EXPECT_EQ(cleanups, 1);
    EXPECT_EQ(lastCleaned, &a);
    EXPECT_EQ(slot.release(), &b);
    EXPECT_EQ(slot.get(), nullptr);
    EXPECT_EQ(cleanups, 1);
}

TEST(ThreadSpecificTest, EachThreadHasItsOwnValueAndItsEndCleansUp) {
    cleanups = 0;
    TSP_Implementor slot(&countCleanup);
    int mine = 0;
    int theirs = 0;
    slot.set(&mine);
    std::thread([&] {
        EXPECT_EQ(slot.get(), nullptr);
        slot.set(&theirs);
    }).join();
    EXPECT_EQ(cleanups, 1);
    EXPECT_EQ(lastCleaned, &theirs);
    EXPECT_EQ(slot.release(), &mine);
}

TEST(ThreadSpecificTest, TheTypedPointerDeletesItsObject) {
    struct Counted {
        int& deaths;
        ~Counted() { ++deaths; }
    };
    int deaths = 0;
    ThreadSpecificPointer<Counted> pointer;
    pointer.set(new Counted{deaths});
    pointer.set(new Counted{deaths});
    EXPECT_EQ(deaths, 1);
    pointer.set(pointer.get());
    EXPECT_EQ(deaths, 1);
    std::thread([&] { pointer.set(new Counted{deaths}); }).join();
    EXPECT_EQ(deaths, 2);
    delete pointer.release();
    EXPECT_EQ(deaths, 3);
    EXPECT_EQ(pointer.get(), nullptr);
}

TEST(ThreadSpecificTest, AKeyThatCouldNotBeMadeIsRemembered) {
    expectChecked("pthread_key_create", "Resource temporarily unavailable", [] {
        const FailNth fault(Call::pthread_key_create, 1, EAGAIN);
        TSP_Implementor slot(&countCleanup);
        int a = 0;
        slot.set(&a);
        if (slot.get() != nullptr || slot.release() != nullptr) fputs("somebody else's", stdout);
    });
    expectChecked("pthread_setspecific", "Cannot allocate memory", [] {
        TSP_Implementor slot(&countCleanup);
        int a = 0;
        const FailNth fault(Call::pthread_setspecific, 1, ENOMEM);
        slot.set(&a);
    });
}

}  // namespace
