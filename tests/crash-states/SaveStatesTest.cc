#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <map>
#include <string>

#include "crash-states/CrashStates.h"
#include "crash-states/Effort.h"
#include "crash-states/RealDirectory.h"
#include "crash-states/Recorder.h"
#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

// A plain save of the library, which rewrites the record file in place and syncs nothing. What it
// promises after a power failure, during the save or after it until the system has written the
// file to the disk by itself:
//
//   - The file is there, unless the save was the one that made it. No other file is touched.
//   - It is as long as it was, as long as what was saved, or ends anywhere between at the bound of
//     a block or of a write; it may be empty.
//   - Each of its blocks holds what it held, what the save wrote there, or zeros.
//   - A program that reads it gets through, whatever is left.
//
// It does not promise the old records or the new ones, nor that a loss is told: a file that was cut
// between two records, and one with zeros at a record's place, read as whole.
namespace {

using namespace crashstates;
using testing::AnyOf;
using testing::Contains;
using testing::Eq;
using testing::Gt;
using testing::Key;
using testsupport::ChildResult;
using testsupport::TempDir;

class SaveStates : public testing::Test {
  protected:
    void SetUp() override {
        if (testsupport::isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    }
    History recordSave(const std::string& key, const std::string& value) const {
        return record(_dir.path(),
                      [&] {
                          storesteps::store().setDBFile(Pathname(_data));
                          storesteps::store().readFile();
                          storesteps::put(key, value, true);
                          return 0;
                      })
            .history;
    }
    // What a program says that reads the file after the power failure. It gets no records out: one
    // may seem to have gigabytes.
    ChildResult readAfterwards(const State& state) const {
        makeDirectory(state, _dir.path());
#ifdef __SANITIZE_THREAD__  // whose calloc touches all that it gives, and these are gigabytes
        return {0, 0, "", "not tried"};
#endif
        return testsupport::runInChild([&] {
            storesteps::store().setDBFile(Pathname(_data));
            try {
                storesteps::store().readFile();
            } catch (const ComponentException&) {  // told, too
            }
            return 0;
        });
    }
    // How a file differs from the old one and the new one; "" when it breaks the promise.
    std::string kindOf(const std::string& bytes) const {
        if (bytes.empty()) return "empty";
        if (bytes == _old) return "the old";
        if (bytes == _new) return "the new";
        if (_new.compare(0, bytes.size(), bytes) == 0) return "a beginning";
        bool hasZeros = false;
        for (std::size_t at = 0; at < bytes.size(); at += _bounds.blockSize) {
            const std::string block = bytes.substr(at, _bounds.blockSize);
            const bool isZeros = block.find_first_not_of('\0') == block.npos;
            if (!isZeros && !isBlockOf(_old, at, block) && !isBlockOf(_new, at, block)) return "";
            hasZeros = hasZeros || isZeros;
        }
        return hasZeros ? "zeros" : "a mixture";
    }
    // As it stands there, or with zeros behind the file's end.
    bool isBlockOf(const std::string& whole, std::size_t at, const std::string& block) const {
        std::string there = at < whole.size() ? whole.substr(at, _bounds.blockSize) : "";
        there.resize(block.size());
        return there == block;
    }

    const TempDir _dir;
    const std::string _data = _dir.file("data");
    const Bounds _bounds{16, 1U << 14, NameOrder::OF_EACH};
    std::string _old;
    std::string _new;
};

TEST_F(SaveStates, AreOfOldBlocksNewOnesAndZerosAndEachCanBeRead) {
    const std::string value(isThorough() ? 90 : 20, 'v');
    _old = storesteps::kVersionRecord + storesteps::record("a", "first value") +
           storesteps::record("c", "a longer second one");
    _new = storesteps::kVersionRecord + storesteps::record("a", value) +
           storesteps::record("c", "a longer second one");
    testsupport::writeFile(_data, _old);
    const History history = recordSave("a", value);
    const CrashStates states(history, _bounds);
    std::map<std::string, unsigned> kinds;
    unsigned untold = 0;
    for (const State& state : states.all()) {
        ASSERT_EQ(state.names.size(), 1U);
        const std::string& bytes = state.names.at("data").file->bytes;
        const std::string kind = kindOf(bytes);
        ASSERT_NE(kind, "") << testing::PrintToString(bytes);
        ++kinds[kind];
        const ChildResult read = readAfterwards(state);
        ASSERT_EQ(read.status, 0) << testing::PrintToString(bytes);
        if (kind != "the old" && kind != "the new" && read.err.empty()) ++untold;
    }
    for (const char* kind : {"the old", "the new", "empty", "a beginning", "zeros", "a mixture"})
        EXPECT_THAT(kinds, Contains(Key(kind))) << "the promise says too little";
#ifndef __SANITIZE_THREAD__
    EXPECT_THAT(untold, Gt(0U));
#endif
    printStates("library, put and save", history, states,
                "old or new or zeros, block by block; " + std::to_string(untold) +
                    " losses that reading does not tell");
}

TEST_F(SaveStates, OfTheFirstSaveAreNoFileOrABeginningOrZeros) {
    _new = storesteps::kVersionRecord + storesteps::record("a", "value");
    const History history = recordSave("a", "value");
    const CrashStates states(history, _bounds);
    std::map<std::string, unsigned> kinds;
    for (const State& state : states.all()) {
        const auto data = state.names.find("data");
        const bool isThere = data != state.names.end();
        const std::string kind = isThere ? kindOf(data->second.file->bytes) : "no file";
        EXPECT_THAT(kind, AnyOf("no file", "empty", "a beginning", "zeros", "the new"));
        EXPECT_THAT(state.names.size(), Eq(isThere ? 1U : 0U));
        ++kinds[kind];
        EXPECT_EQ(readAfterwards(state).status, 0);
    }
    EXPECT_EQ(kinds.size(), 5U);
    printStates("library, first save", history, states, "new or zeros, block by block, or no file");
}

TEST_F(SaveStates, LeaveNothingToChanceOnceTheProgramSyncs) {
    testsupport::writeFile(_data, storesteps::kVersionRecord);
    History history = recordSave("a", "value");
    history.events.push_back(SyncFile{history.before.names.at("data"), false});
    const CrashStates states(history, _bounds);
    for (const State& state : states.all()) {
        if (state.latest < history.events.size()) continue;
        EXPECT_EQ(state.names.at("data").file->bytes,
                  storesteps::kVersionRecord + storesteps::record("a", "value"));
    }
}

TEST_F(SaveStates, ShowBytesThatNobodySaved) {
    _old = storesteps::kVersionRecord;
    _new = _old + storesteps::record("a", "value");
    testsupport::writeFile(_data, _old);
    History history = recordSave("a", "value");
    history.events.push_back(Write{history.before.names.at("data"), 20, "X"});
    const CrashStates states(history, _bounds);
    EXPECT_TRUE(std::any_of(states.all().begin(), states.all().end(), [&](const State& state) {
        return kindOf(state.names.at("data").file->bytes).empty();
    }));
}

}  // namespace
