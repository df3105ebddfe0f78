#include "framework/service/RecordFileManager/RecordTable.h"

#include <gmock/gmock.h>

#include <cerrno>
#include <map>
#include <memory>
#include <new>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Faults.h"
#include "support/Sweep.h"

namespace {

using testing::ElementsAre;
using testsupport::Call;
using testsupport::FailNth;
using testsupport::testScale;

using Model = std::map<std::string, std::string>;
using Records = std::vector<std::pair<std::string, std::string>>;

// A table, and a map that was given the same. Records that are not in the table any more are
// overwritten, so that a look at one shows.
class TableAndModel {
  public:
    void put(const std::string& key, const std::string& value) {
        auto record = std::make_unique<std::string>(storesteps::record(key, value));
        const char* const old = table.put(record->data());
        const auto had = _owned.find(key);
        EXPECT_EQ(old, had == _owned.end() ? nullptr : had->second->data()) << key;
        if (had != _owned.end()) spoil(key);
        _owned[key] = std::move(record);
        model[key] = value;
    }
    void erase(const std::string& key) {
        table.erase(key);
        spoil(key);
        model.erase(key);
    }
    void expectSame(const std::string& key) const {
        const char* const found = table.find(key);
        const auto expected = model.find(key);
        ASSERT_EQ(found != nullptr, expected != model.end()) << key;
        if (found == nullptr) return;
        EXPECT_EQ(RecordView(found).key(), key);
        EXPECT_EQ(RecordView(found).value(), expected->second);
    }
    void expectSameWalk(const std::string& prefix) const {
        Records expected;
        for (auto it = model.lower_bound(prefix);
             it != model.end() && it->first.compare(0, prefix.size(), prefix) == 0; ++it)
            expected.emplace_back(*it);
        EXPECT_EQ(walked(prefix), expected) << prefix;
    }
    Records walked(const std::string& prefix) const {
        Records records;
        table.walk(prefix, [&](RecordView record) {
            records.emplace_back(record.key(), record.value());
            return true;
        });
        return records;
    }

    RecordTable table;
    Model model;

  private:
    void spoil(const std::string& key) {
        _owned[key]->assign(_owned[key]->size(), '\xff');
        _owned.erase(key);
    }
    std::map<std::string, std::unique_ptr<std::string>> _owned;
};

// Few letters, so that keys meet and are each other's beginnings.
std::string randomKey(std::mt19937& random, unsigned letters, unsigned most) {
    std::string key(random() % (most + 1), '\0');
    for (char& c : key)
        c = "a\0\xff_"[random() % letters];
    return key;
}

void expectAllTheSame(const TableAndModel& both) {
    EXPECT_EQ(both.table.size(), both.model.size());
    both.expectSameWalk("");
    for (const auto& [key, value] : both.model)
        both.expectSame(key);
}

TEST(RecordTableTest, AnEmptyOneHasNothing) {
    TableAndModel both;
    EXPECT_EQ(both.table.size(), 0U);
    EXPECT_EQ(both.table.find(""), nullptr);
    EXPECT_EQ(both.table.find("a"), nullptr);
    EXPECT_THAT(both.walked(""), ElementsAre());
    EXPECT_THAT(both.walked("a"), ElementsAre());
}

TEST(RecordTableTest, AWalkEndsWhereTheVisitorSaysSo) {
    TableAndModel both;
    for (const char* key : {"a", "b", "c"})
        both.put(key, "");
    std::string seen;
    both.table.walk("", [&](RecordView record) {
        seen += record.key();
        return seen.size() < 2;
    });
    EXPECT_EQ(seen, "ab");
}

TEST(RecordTableTest, DoesWhatAMapDoesWithFewKeys) {
    for (unsigned seed = 0; seed < 40 * testScale(); ++seed) {
        std::mt19937 random(seed);
        TableAndModel both;
        for (unsigned step = 0; step < 2000; ++step) {
            const std::string key = randomKey(random, 2 + seed % 3, 5);
            if (random() % 3 != 0) {
                both.put(key, std::to_string(step));
            } else if (both.model.count(key) != 0) {
                both.erase(key);
            }
            both.expectSame(randomKey(random, 2 + seed % 3, 5));
            if (step % 50 == 0) both.expectSameWalk(randomKey(random, 2 + seed % 3, 2));
        }
        expectAllTheSame(both);
    }
}

// So many that chunks are split and emptied.
TEST(RecordTableTest, DoesWhatAMapDoesWithManyKeys) {
    for (unsigned seed = 0; seed < 4 * testScale(); ++seed) {
        std::mt19937 random(seed);
        TableAndModel both;
        for (unsigned step = 0; step < 20000; ++step) {
            const std::string key = std::to_string(random() % 6000);
            const bool growing = step % 10000 < 6000;
            if (random() % 10 < (growing ? 9U : 2U)) {
                both.put(key, std::to_string(step));
            } else if (both.model.count(key) != 0) {
                both.erase(key);
            }
            both.expectSame(std::to_string(random() % 6000));
            if (step % 500 == 0) both.expectSameWalk(std::to_string(random() % 100));
        }
        expectAllTheSame(both);
        while (!both.model.empty())
            both.erase(both.model.begin()->first);
        expectAllTheSame(both);
        both.put("again", "1");
        expectAllTheSame(both);
    }
}

TEST(RecordTableTest, KeysInAnyOrderComeOutSorted) {
    for (const int by : {1, -1, 7919}) {
        TableAndModel both;
        for (int i = 0; i < 3000; ++i)
            both.put(std::to_string(100000 + (i * by % 3000 + 3000) % 3000), "");
        ASSERT_EQ(both.model.size(), 3000U);
        expectAllTheSame(both);
    }
}

// Keys whose hashes point to one slot, more than lie near it.
std::vector<std::string> collidingKeys(std::size_t count) {
    std::vector<std::string> keys;
    for (unsigned i = 0; keys.size() < count; ++i) {
        const std::string key = std::to_string(i);
        if (KeyIndex::hashOf(key) % 4096 == 7) keys.push_back(key);
    }
    return keys;
}

TEST(RecordTableTest, KeysThatCollideAreFound) {
    const std::vector<std::string> keys = collidingKeys(200);
    TableAndModel both;
    for (const std::string& key : keys)
        both.put(key, "1");
    expectAllTheSame(both);
    for (std::size_t i = 0; i < keys.size(); i += 2)
        both.put(keys[i], "2");
    expectAllTheSame(both);
    for (std::size_t i = 0; i < keys.size(); i += 3) {
        both.erase(keys[i]);
        both.expectSame(keys[i]);
    }
    expectAllTheSame(both);
    for (const std::string& key : keys)
        both.put(key, "3");
    expectAllTheSame(both);
}

TEST(RecordTableTest, WithoutMemoryItIsAsItWas) {
    TableAndModel both;
    std::vector<std::string> refused;
    unsigned failures = 0;
    for (unsigned i = 0; i < 2000; ++i) {
        const std::string key = std::to_string(i * 7919 % 2000);
        const std::string record = storesteps::record(key, "");
        for (unsigned long k = 1;; ++k) {
            bool thrown = false;
            {
                const FailNth fault(Call::allocation, k, ENOMEM);
                try {
                    both.table.put(record.data());
                } catch (const std::bad_alloc&) {
                    thrown = true;
                }
            }
            if (!thrown) break;
            ++failures;
            ASSERT_EQ(both.table.find(key), nullptr);
            ASSERT_EQ(both.table.size(), both.model.size());
        }
        both.table.erase(key);
        both.put(key, "");
    }
    EXPECT_GT(failures, 15U);
    expectAllTheSame(both);
}

}  // namespace
