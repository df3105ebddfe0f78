#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "examples/RunningTallyd.h"
#include "support/Sweep.h"
#include "tools/RecordsTool.h"

namespace {

using testing::Contains;
using testsupport::TallydTest;

// With enough records that a save takes a while, also where all files are in memory.
void fillStore(const std::string& directory) {
    std::vector<std::pair<std::string, std::string>> records;
    for (int i = 0; i < 20000; ++i)
        records.emplace_back("filler/" + std::to_string(i), std::string(100, 'x'));
    std::filesystem::create_directories(directory);
    testsupport::writeFile(directory + "/data", testsupport::fileOf(records));
}

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

TEST_F(TallydTest, AKillInTheMiddleOfASaveLeavesAWholeFile) {
    fillStore(dir.file("db/hashDb"));
    const std::string half = dir.file("db/hashDb/data.new");  // there while a save is under way
    const auto count = [this] { return std::strtoul(saved("apple").c_str(), nullptr, 10); };
    unsigned long before = 0;
    unsigned long sent = 0;
    for (unsigned round = 0; round < 10 * testsupport::testScale(); ++round) {
        ASSERT_EQ(start().status, 0);
        const auto saveOneMore = [&] {
            send("apple");
            ++sent;
            signal(SIGHUP);
        };
        const auto isSaving = [&] { return access(half.c_str(), F_OK) == 0; };
        eventually([&] { return saveOneMore(), before < count(); });
        bool seen = false;
        for (unsigned n = 0; n < 100000 && !(seen = isSaving()); ++n)
            saveOneMore();
        EXPECT_TRUE(seen);
        for (unsigned n = 0; n < round; ++n)
            isSaving();  // takes a while, another in each round
        EXPECT_EQ(WTERMSIG(end(SIGKILL)), SIGKILL);
        EXPECT_EQ(records({"check"}).status, 0);
        const unsigned long now = count();
        EXPECT_GE(now, before);
        EXPECT_LE(now, sent);
        before = now;
    }
}

}  // namespace
