#include "base/ThreadText.h"

#include <gtest/gtest.h>
#include <pthread.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <memory>
#include <string>
#include <thread>

#include "support/Child.h"
#include "support/Faults.h"

namespace {

using testsupport::Call;
using testsupport::CountCalls;
using testsupport::FailNth;

const std::string kLong(1000, 'x');

// A thread of its own begins without any texts. Where allocations are counted, those of the thread
// itself are over.
template <class Body>
void inOwnThread(Body body) {
    std::thread(body).join();
}

TEST(ThreadTextTest, TheSecondTextNeedsNoMemory) {
    inOwnThread([] {
        *ThreadText() = kLong;
        const CountCalls allocations(Call::allocation);
        for (int i = 0; i < 10; ++i) {
            ThreadText text;
            EXPECT_EQ(*text, "");
            *text = kLong;
        }
        EXPECT_EQ(allocations.count(), 0U);
    });
}

TEST(ThreadTextTest, TextsInUseAtOnceAreDifferentOnesHoweverMany) {
    inOwnThread([] {
        for (int round = 0; round < 2; ++round) {
            std::unique_ptr<ThreadText> texts[9];
            for (int i = 0; i < 9; ++i) {
                texts[i] = std::make_unique<ThreadText>();
                **texts[i] = std::string(1, static_cast<char>('0' + i));
            }
            for (int i = 9; i-- > 0;) {
                EXPECT_EQ(**texts[i], std::string(1, static_cast<char>('0' + i)));
                texts[i].reset();
            }
        }
    });
}

TEST(ThreadTextTest, WhatGrewBeyondAllMeasureIsGivenBack) {
    inOwnThread([] {
        for (const std::size_t size : {16000U, 16384U, 16385U}) {
            std::size_t grown = 0;
            {
                ThreadText text;
                (*text).reserve(size);
                grown = (*text).capacity();  // exactly `size` in most standard libraries
            }
            EXPECT_EQ((*ThreadText()).capacity() == grown, grown <= 16384) << grown;
        }
    });
}

TEST(ThreadTextTest, WithoutMemoryOrAKeyItIsATextLikeAnyOther) {
    for (const Call call : {Call::allocation, Call::pthread_setspecific}) {
        inOwnThread([call] {
            {
                const FailNth fault(call, 1, ENOMEM);
                ThreadText text;
                *text = "short";
                EXPECT_EQ(*text, "short");
                EXPECT_TRUE(fault.fired());
            }
            const CountCalls allocations(Call::allocation);
            *ThreadText() = kLong;
            *ThreadText() = kLong;
            EXPECT_EQ(allocations.count(), 2U) << "nothing is kept from now on";
        });
    }
}

// The key is made before a process is forked. So this looks at a process that never was.
TEST(ThreadTextTest, WithoutAKeyNoThreadKeepsAny) {
    constexpr const char* kFresh = "KORVEX_TEST_FRESH_PROCESS";
    if (std::getenv(kFresh) == nullptr) {
        const auto result = testsupport::runInChild([] {
            setenv(kFresh, "1", 1);
            execl("/proc/self/exe", "tests", "--gtest_filter=ThreadTextTest.WithoutAKey*",
                  static_cast<char*>(nullptr));
            return 1;
        });
        EXPECT_EQ(result.status, 0) << result.out;
        return;
    }
    const FailNth fault(Call::pthread_key_create, 1, EAGAIN);
    *ThreadText() = kLong;
    ASSERT_TRUE(fault.fired());
    unsigned long allocated = 0;
    std::thread([&] {
        *ThreadText() = kLong;
        const CountCalls allocations(Call::allocation);
        *ThreadText() = kLong;
        allocated = allocations.count();
    }).join();
    EXPECT_GT(allocated, 0U);
}

// The order in which a thread's keys are destroyed is open.
TEST(ThreadTextTest, AnEndingThreadMayStillUseOne) {
    static int used = 0;
    const auto use = [](void*) {
        *ThreadText() = kLong;
        ++used;
    };
    pthread_key_t before = 0;
    pthread_key_t after = 0;
    ASSERT_EQ(pthread_key_create(&before, use), 0);
    inOwnThread([] { *ThreadText() = kLong; });
    ASSERT_EQ(pthread_key_create(&after, use), 0);
    inOwnThread([=] {
        pthread_setspecific(before, &used);
        pthread_setspecific(after, &used);
        *ThreadText() = kLong;
    });
    EXPECT_EQ(used, 2);
    pthread_key_delete(before);
    pthread_key_delete(after);
}

}  // namespace
