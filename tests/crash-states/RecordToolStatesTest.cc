#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/xattr.h>

#include <map>
#include <ostream>
#include <string>
#include <vector>

#include "crash-states/CrashStates.h"
#include "crash-states/Edits.h"
#include "crash-states/Effort.h"
#include "crash-states/RealDirectory.h"
#include "crash-states/Recorder.h"
#include "tools/RecordsTool.h"

// The record tool's writing verbs. What they promise after a power failure at any moment:
//
//   - The tool reads the old records or the new ones. Once a run has ended, the new ones.
//   - The file has the mode, the owner and the extended attributes that it had, or is for its owner
//     only where there was none. No other file is changed.
//   - The next run works on what is there, and takes away what the cut-off run has left. A leftover
//     whose first block did not reach the disk is no beginning of a record file, so it stays.
namespace {

using namespace crashstates;
using testing::IsEmpty;
using testing::Not;
using testsupport::ChildResult;
using testsupport::fileOf;

const std::string kValue(80, 'v');
const std::string kDump = "VERSION=3\nHEADER=END\n 62\n " + [] {
    std::string digits;
    for (unsigned i = 0; i < 80; ++i)
        digits += "76";
    return digits;
}() + "\n 63\n 3333\nDATA=END\n";
const std::string kBatch = "put\tb\t" + kValue + "\nremove\ta\nput\tc\t33\n";

struct Verb {
    const char* name;
    std::vector<std::string> arguments;
    std::string input;   // on its standard input
    std::string before;  // the record file's bytes
    bool isThere;        // the record file is
    std::string target;  // the file that it writes
    int status;
    std::size_t blockSize = 64;  // bytes; half of it where all is asked for

    friend void PrintTo(const Verb& verb, std::ostream* out) { *out << verb.name; }
};

const std::string kBefore = fileOf({{"a", "1"}, {"c", "3"}});

const Verb kVerbs[] = {
    {"put a new file", {"put", "b", kValue}, "", "", false, "data", 0},
    {"put", {"put", "b", kValue}, "", kBefore, true, "data", 0},
    {"put by several writes",
     {"put", "b", "-"},
     std::string(200000, 'v'),
     kBefore,
     true,
     "data",
     0,
     131072},
    {"remove", {"remove", "a"}, "", kBefore, true, "data", 0},
    {"remove all", {"remove", "a", "c"}, "", kBefore, true, "data", 0},
    {"load", {"load"}, kDump, kBefore, true, "data", 0},
    {"load a new file", {"load"}, kDump, "", false, "data", 0},
    {"load --replace", {"load", "--replace"}, kDump, kBefore, true, "data", 0},
    {"batch", {"batch"}, kBatch, kBefore, true, "data", 0},
    {"salvage", {"salvage", "-o", "salvaged"}, "", kBefore + "\5", true, "salvaged", 3},
};

// What a state breaks of the promise; empty: nothing.
using Verdict = std::string;

class RecordToolStates : public testsupport::RecordsToolTest,
                         public testing::WithParamInterface<Verb> {
  protected:
    void SetUp() override {
        if (testsupport::isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
        std::filesystem::create_directories(_files);
        reset();
        _oldReading = read();
        _oldNext = readAfterNextRun();
        reset();
        const Recording recording = recordVerb();
        ASSERT_EQ(recording.status, verb().status);
        history = recording.history;
        _newReading = read();
        _newNext = readAfterNextRun();
        ASSERT_FALSE(_oldReading == _newReading);
        _attributes = attributesOf(recording.history);
    }
    static const Verb& verb() { return GetParam(); }
    Bounds bounds() const {
        return {verb().blockSize / (isThorough() ? 2 : 1), 1U << 14, NameOrder::OF_EACH};
    }

    // The directory as it was, its file with a mode and an attribute that a new one has not.
    void reset() const {
        for (const auto& entry : std::filesystem::directory_iterator(_files))
            std::filesystem::remove(entry.path());
        if (!verb().isThere) return;
        testsupport::writeFile(_files + "/data", verb().before);
        chmod((_files + "/data").c_str(), 0640);
        if (isThorough()) setxattr((_files + "/data").c_str(), "user.note", "kept", 4, 0);
    }
    Recording recordVerb() const {
        testsupport::writeFile(dir.file("input"), verb().input);
        return record(_files, [&] {
            static_cast<void>(!chdir(_files.c_str()));
            dup2(open(dir.file("input").c_str(), O_RDONLY), 0);
            dup2(open("/dev/null", O_WRONLY), 1);
            dup2(1, 2);
            std::vector<std::string> arguments{"-f", "data"};
            arguments.insert(arguments.end(), verb().arguments.begin(), verb().arguments.end());
            return execTool(arguments);
        });
    }

    // What the tool says of the target.
    struct Reading {
        int status;
        std::string out;

        friend bool operator==(const Reading& a, const Reading& b) {
            return a.status == b.status && a.out == b.out;
        }
    };
    Reading read() const {
        const ChildResult result = run({"-f", _files + "/" + verb().target, "dump"});
        return {result.status, result.out};
    }
    Reading readAfterNextRun() const {
        const ChildResult next = run({"-f", _files + "/" + verb().target, "put", "z", "next"});
        return next.status == 0 ? read() : Reading{next.status, next.err};
    }

    Verdict judge(const State& state, std::size_t events) {
        makeDirectory(state, _files);
        const Reading reading = read();
        const bool isNew = reading == _newReading;
        if (!isNew && !(reading == _oldReading)) return "neither the old records nor the new ones";
        if (!isNew && state.latest == events) return "the run had ended, and its change is lost";
        const Verdict others = judgeFiles(state, isNew);
        if (!others.empty()) return others;
        const Reading next = readAfterNextRun();
        if (!(next == (isNew ? _newNext : _oldNext))) return "the next run fails: " + next.out;
        return judgeLeftovers();
    }
    Verdict judgeFiles(const State& state, bool isNew) const {
        const auto target = state.names.find(verb().target);
        if (target != state.names.end() && target->second.file->attributes != _attributes) {
            return "other attributes";
        }
        for (const auto& [name, inode] : history.before.names) {
            if (name == verb().target && isNew) continue;
            const auto at = state.names.find(name);
            const bool isSame =
                at != state.names.end() && *at->second.file == history.before.files.at(inode);
            if (!isSame) return name + " is changed";
        }
        return "";
    }
    Verdict judgeLeftovers() {
        for (const auto& entry : std::filesystem::directory_iterator(_files)) {
            const std::string name = entry.path().filename().string();
            if (name == verb().target || history.before.names.count(name) > 0) continue;
            const std::string bytes = bytesOf(entry.path().string());
            if (bytes.substr(0, 4) == std::string(4, '\0') && !bytes.empty()) {
                ++_zerosLeft;
                continue;
            }
            return name + " is left";
        }
        return "";
    }
    // The last states first: what happens to them is likeliest to be wrong.
    Verdict firstViolation(const History& ofHistory) {
        const CrashStates states(ofHistory, bounds());
        for (auto state = states.all().rbegin(); state != states.all().rend(); ++state) {
            const Verdict verdict = judge(*state, ofHistory.events.size());
            if (!verdict.empty()) return verdict;
        }
        return "";
    }
    // Of the file that was there, or of the one that is made.
    Attributes attributesOf(const History& ofHistory) const {
        const auto& names = ofHistory.before.names;
        const auto old = names.find(verb().target);
        if (old != names.end()) return ofHistory.before.files.at(old->second).attributes;
        Attributes attributes = crashstates::attributesOf(_files + "/" + verb().target);
        EXPECT_EQ(attributes["mode"], "0600");
        return attributes;
    }

    History history;
    unsigned _zerosLeft = 0;

  private:
    const std::string _files = dir.file("files");
    Reading _oldReading;
    Reading _newReading;
    Reading _oldNext;  // when the next run has put a record
    Reading _newNext;
    Attributes _attributes;
};

bool isSync(const Event& event) {
    return isA<SyncFile>(event) || isA<SyncDirectory>(event);
}

// What gives the new file its name.
bool isPublishing(const Event& event) {
    return isA<Rename>(event) || isA<Link>(event);
}

TEST_P(RecordToolStates, ReadAsTheOldRecordsOrTheNewOnesAndTheNextRunWorks) {
    const CrashStates states(history, bounds());
    EXPECT_TRUE(states.complete());
    std::map<std::string, unsigned> verdicts;
    for (const State& state : states.all())
        ++verdicts[judge(state, history.events.size())];
    EXPECT_EQ(verdicts[""], states.all().size()) << testing::PrintToString(verdicts);
    printStates(std::string("korvex-records ") + verb().name, history, states,
                "old or new; " + std::to_string(_zerosLeft) + " leave a file of zeros");
}

TEST_P(RecordToolStates, ShowEachSyncThatIsMissing) {
    unsigned syncs = 0;
    for (std::size_t i = 0; i < history.events.size(); ++i) {
        if (!isSync(history.events[i])) continue;
        ++syncs;
        EXPECT_THAT(firstViolation(without(history, i)), Not(IsEmpty()))
            << describe(history.events[i]);
    }
    EXPECT_EQ(syncs, 2U) << "of the new file and of the directory";
}

TEST_P(RecordToolStates, ShowAWrongOrder) {
    const auto isWrite = [](const Event& event) { return isA<Write>(event); };
    const auto isFileSync = [](const Event& event) { return isA<SyncFile>(event); };
    const auto isDirectorySync = [](const Event& event) { return isA<SyncDirectory>(event); };
    EXPECT_THAT(firstViolation(moved(history, isPublishing, isWrite)), Not(IsEmpty()));
    EXPECT_THAT(firstViolation(moved(history, isPublishing, isFileSync)), Not(IsEmpty()));
    EXPECT_THAT(firstViolation(moved(history, isFileSync, isWrite)), Not(IsEmpty()));
    EXPECT_THAT(firstViolation(moved(history, isDirectorySync, isPublishing)), Not(IsEmpty()));
}

INSTANTIATE_TEST_SUITE_P(RecordToolStates, RecordToolStates, testing::ValuesIn(kVerbs),
                         [](const auto& verb) {
                             std::string name;
                             for (const char c : std::string(verb.param.name))
                                 name += std::isalnum(static_cast<unsigned char>(c)) ? c : '_';
                             return name;
                         });

}  // namespace
