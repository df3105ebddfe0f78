#include <korvex/framework/service/RecordFileManager.h>

#include <gmock/gmock.h>

#include <atomic>
#include <map>
#include <set>
#include <string>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/KilledChild.h"
#include "support/Sweep.h"
#include "tools/RecordsTool.h"

namespace {

using testsupport::Call;
using testsupport::fileOf;
using testsupport::killAfter;
using testsupport::killAtCall;
using testsupport::testScale;

// Large enough for several calls of write(2) in each save.
std::string valueOf(unsigned n) {
    return std::string(20000, static_cast<char>('a' + n % 26));
}

// The bytes of the n-th save below: n + 1 records.
std::string saved(unsigned n) {
    std::vector<std::pair<std::string, std::string>> records;
    for (unsigned i = 0; i <= n; ++i)
        records.emplace_back("key" + std::to_string(1000 + i), valueOf(i));
    return fileOf(records);
}

constexpr unsigned kSaves = 12;

// The store itself promises no more than a beginning of what it was saving; the tool tells it from
// a whole file.
class StoreCrash : public testsupport::RecordsToolTest {
  protected:
    void saveAgainAndAgain() const {
        storesteps::store().setDBFile(Pathname(data));
        for (unsigned n = 0; n < kSaves; ++n)
            storesteps::put("key" + std::to_string(1000 + n), valueOf(n), true);
    }
    void expectABeginning() {
        const std::string left = stored();
        bool known = left.empty();
        bool whole = left.empty();
        for (unsigned n = 0; n < kSaves && !whole; ++n) {
            const std::string all = saved(n);
            known = known || all.compare(0, left.size(), left) == 0;
            whole = left == all || endsAtARecord(left, n);
        }
        EXPECT_TRUE(known) << left.size();
        EXPECT_EQ(run({"check"}).status, whole ? 0 : 3) << left.size();
        ++_seen[whole ? "whole" : "cut"];
        _sizes.insert(left.size());
    }
    // A file that was cut between two records cannot be told from a whole one.
    static bool endsAtARecord(const std::string& left, unsigned n) {
        const std::string all = saved(n);
        const std::size_t head = fileOf({}).size();
        const std::size_t record = fileOf({{"key1000", valueOf(0)}}).size() - head;
        return left.size() >= head && all.compare(0, left.size(), left) == 0 &&
               (left.size() - head) % record == 0;
    }

    std::map<std::string, unsigned> _seen;
    std::set<std::size_t> _sizes;  // of the files that were left
};

TEST_F(StoreCrash, AKillAtEachCallOfASaveLeavesABeginningOfIt) {
    unsigned kills = 0;
    for (const Call call : {Call::fopen, Call::fwrite, Call::fclose}) {
        for (unsigned long k = 1; k < 300; ++k) {
            Pathname(data).unlink();
            if (!killAtCall(call, k, [this] { saveAgainAndAgain(); })) break;
            ++kills;
            Pathname(data).exists() ? expectABeginning() : void();
        }
    }
    EXPECT_GE(kills, 50U);
    EXPECT_GT(_seen["whole"], 0U);
    EXPECT_GT(_sizes.size(), 10U);
    std::printf("[  killed  ] saving: %u times\n", kills);
}

TEST_F(StoreCrash, AKillAtAnyMomentOfASaveLeavesABeginningOfIt) {
    unsigned kills = 0;
    for (unsigned n = 0; n < 20 * testScale(); ++n) {
        Pathname(data).unlink();
        if (killAfter(100 + 53 * n % 2000, [this] { saveAgainAndAgain(); })) ++kills;
        Pathname(data).exists() ? expectABeginning() : void();
    }
    EXPECT_GT(kills, 0U);
    std::printf("[  killed  ] saving, at random: %u times\n", kills);
}

}  // namespace
