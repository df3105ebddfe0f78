#include <korvex/framework/service/RecordFileManager.h>

#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

// exit(3) and fork(2) while another thread saves or loads. Both hand on what a stdio stream has in
// its buffer, whoever is using it.

static bool forkedAmidThreads = false;

// Asked by the leak sanitizer at a process's exit. In a child of fork it does not see what the
// parent's other threads held on their stacks.
extern "C" int __lsan_is_turned_off();
extern "C" int __lsan_is_turned_off() {
    return forkedAmidThreads ? 1 : 0;
}

namespace {

using namespace storesteps;
using testsupport::ChildResult;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::testScale;

constexpr unsigned kRecords = 3000;  // some calls of write(2) for each save

std::string keyOf(unsigned i) {
    return "key" + std::to_string(10000 + i);
}

// No two places of the file look alike, and no two generations of it.
std::string valueOf(unsigned i, char generation) {
    return generation + std::string(40 + i % 50, 'v') + std::to_string(i) + generation;
}

std::string fileOf(char generation) {
    std::string content = kVersionRecord;
    for (unsigned i = 0; i < kRecords; ++i)
        content += record(keyOf(i), valueOf(i, generation));
    return content;
}

void hold(char generation) {
    for (unsigned i = 0; i < kRecords; ++i)
        put(keyOf(i), valueOf(i, generation));
}

// The ways to save. All of them leave the same records.
struct Saving {
    const char* name;
    void (*save)();
};

const std::vector<Saving>& savings() {
    static const std::vector<Saving> all{
        {"saveToFile", [] { store().saveToFile(); }},
        {"put", [] { put(keyOf(0), valueOf(0, 'a'), true); }},
        {"remove",
         [] {
             put("removed", "");
             store().remove("removed");
         }},
    };
    return all;
}

void pause(unsigned microseconds) {
    std::this_thread::sleep_for(std::chrono::microseconds(microseconds));
}

class InterruptedSave : public testing::TestWithParam<Saving> {
  protected:
    TempDir _dir;
    const std::string _file = _dir.file("data");
    const std::string _whole = fileOf('a');
    const unsigned _rounds = 150 * testScale();
};

TEST_P(InterruptedSave, AnExitInAnotherThreadLeavesABeginningOfIt) {
    unsigned cut = 0;
    for (unsigned round = 0; round < _rounds; ++round) {
        const ChildResult child = runInChild([&]() -> int {
            store().setDBFile(Pathname(_file));
            hold('a');
            std::atomic<bool> begun{false};
            // It goes on while the test's own objects are destroyed.
            std::thread([&begun, save = GetParam().save] {
                begun = true;
                for (;;)
                    save();
            }).detach();
            while (!begun)
                std::this_thread::yield();
            pause(37 * round % 1500);
            std::exit(0);
        });
        ASSERT_EQ(child.status, 0) << child.signal << child.err;
        const std::string left = readFile(_file);
        ASSERT_EQ(_whole.compare(0, left.size(), left), 0)
            << "round " << round << ", " << left.size() << " bytes";
        if (left.size() < _whole.size()) ++cut;
    }
    std::printf("[   cut    ] %s: %u of %u\n", GetParam().name, cut, _rounds);
}

TEST_P(InterruptedSave, AChildThatIsForkedInItsMidstAndExitsLeavesItAlone) {
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer takes the parent's thread for one that the child leaks";
#endif
    const ChildResult result = runInChild(
        [&]() -> int {
            store().setDBFile(Pathname(_file));
            hold('a');
            for (unsigned round = 0; round < _rounds; ++round) {
                std::atomic<bool> begun{false};
                std::thread saver([&] {
                    begun = true;
                    GetParam().save();
                });
                while (!begun)
                    std::this_thread::yield();
                pause(13 * round % 400);
                const pid_t child = fork();
                if (child == 0) {
                    forkedAmidThreads = true;
                    std::exit(0);
                }
                int status = 0;
                waitpid(child, &status, 0);
                saver.join();
                if (status != 0) return 2;
                if (readFile(_file) != _whole) {
                    std::printf("round %u", round);
                    return 1;
                }
            }
            return 0;
        },
        110 * testScale());
    EXPECT_EQ(result.status, 0) << result.signal << result.out << result.err;
}

INSTANTIATE_TEST_SUITE_P(EachWay, InterruptedSave, testing::ValuesIn(savings()),
                         [](const auto& param) { return std::string(param.param.name); });

// The child's exit moves the offset of a stream that was read ahead back to where the reader is.
TEST(InterruptedLoad, AChildThatIsForkedInItsMidstAndExitsLeavesItAlone) {
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer takes the parent's thread for one that the child leaks";
#endif
    const TempDir dir;
    const std::string file = dir.file("data");
    testsupport::writeFile(file, fileOf('a'));
    const ChildResult result = runInChild(
        [&]() -> int {
            store().setDBFile(Pathname(file));
            for (unsigned round = 0; round < 150 * testScale(); ++round) {
                hold('b');
                std::atomic<bool> begun{false};
                std::thread loader([&] {
                    begun = true;
                    store().readFile();
                });
                while (!begun)
                    std::this_thread::yield();
                pause(13 * round % 400);
                const pid_t child = fork();
                if (child == 0) {
                    forkedAmidThreads = true;
                    std::exit(0);
                }
                int status = 0;
                waitpid(child, &status, 0);
                loader.join();
                if (status != 0) return 2;
                for (unsigned i = 0; i < kRecords; ++i) {
                    if (get(keyOf(i)) != valueOf(i, 'a')) return 1;
                }
            }
            return 0;
        },
        110 * testScale());
    EXPECT_EQ(result.status, 0) << result.signal << result.out << result.err;
    EXPECT_EQ(result.err, "");
}

}  // namespace
