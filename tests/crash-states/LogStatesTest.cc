#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

#include "crash-states/CrashStates.h"
#include "crash-states/Edits.h"
#include "crash-states/Effort.h"
#include "crash-states/RealDirectory.h"
#include "crash-states/Recorder.h"
#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

// A log file that is appended to and rotated; nothing is synced. What that promises after a power
// failure:
//
//   - There are only the log file and its numbered backups.
//   - Each of them is one of the files that were written, from its first byte on. Its end may be
//     missing, and blocks that the system had not yet written to the disk are zeros. What was on
//     the disk before stays.
//   - A higher number is an older file. No file is there twice, and none is missing between two
//     others. Newer ones may be missing as a whole. Where the file system keeps the order of all
//     changes of a directory, no older one is missing than the one that the rotation deleted.
//   - So no message is there twice or in two files, and each line that is there whole was logged.
//   - The next program logs on: its messages are at the end of the log file, behind whatever was
//     left there; a line that was cut is not ended first.
//
// It does not promise any message that was logged since the system last wrote the file by itself.
namespace {

using namespace crashstates;
using testsupport::TempDir;

Bounds bounds(NameOrder order) {
    return {16, 1U << 14, order};
}

// As long as a block and a half, so that it takes more than one to lose it.
std::string line(unsigned n) {
    return "message number " + std::to_string(1000 + n) + "!!!!\n";
}

struct Shape {
    const char* name;
    unsigned lines;       // that are logged
    unsigned linesAFile;  // before the file is rotated
    unsigned backups;
    unsigned thoroughLines;

    friend void PrintTo(const Shape& shape, std::ostream* out) { *out << shape.name; }
};

class LogStates : public testing::TestWithParam<Shape> {
  protected:
    void SetUp() override {
        if (testsupport::isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    }
    History recordLogging() const {
        testsupport::writeFile(_dir.file("log"), line(0));
        return record(_dir.path(), [&] { return logLines(1, lineCount() + 1); }).history;
    }
    // In a child.
    int logLines(unsigned from, unsigned end) const {
        const std::string limit = std::to_string(line(0).size() * GetParam().linesAFile - 1);
        testsupport::writeFile(_home.file("conf"),
                               "appender.A=File\nappender.A.fileName=" + _dir.file("log") +
                                   "\nappender.A.maxFileSize=" + limit +
                                   "\nappender.A.maxBackupIndex=" +
                                   std::to_string(GetParam().backups) + "\nrootCategory=INFO,A\n");
        Logger::initialize(Pathname(_home.file("conf")), Pathname());
        Logger logger("test");
        for (unsigned n = from; n < end; ++n)
            logger.info(line(n).substr(0, line(n).size() - 1));
        return 0;
    }
    unsigned lineCount() const {
        return isThorough() ? GetParam().thoroughLines : GetParam().lines;
    }
    // Each file that was written, as it was in the end; number 0 is the oldest. The first line was
    // there before.
    std::vector<std::string> generations() const {
        std::vector<std::string> all{""};
        for (unsigned n = 0; n <= lineCount(); ++n) {
            all.back() += line(n);
            if ((n + 1) % GetParam().linesAFile == 0) all.emplace_back();
        }
        return all;
    }

    const TempDir _dir;
    const TempDir _home;
};

std::string nameOf(unsigned backup) {
    return backup == 0 ? "log" : "log." + std::to_string(backup);
}

// Whether it is that file, its end missing, blocks of zeros in it.
bool isLeftOf(const std::string& whole, const std::string& bytes) {
    if (bytes.size() > whole.size()) return false;
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        if (bytes[i] != whole[i] && bytes[i] != '\0') return false;
    }
    return true;
}

// Empty: the state keeps the promise. Files are numbered from 1 in the order of their making.
std::string brokenPromise(const State& state, const std::vector<std::string>& generations,
                          unsigned backups, NameOrder order) {
    std::optional<Inode> newer;
    std::size_t found = 0;
    for (unsigned backup = 0; backup <= backups; ++backup) {
        const auto at = state.names.find(nameOf(backup));
        if (at == state.names.end()) continue;
        const auto& [name, entry] = *at;
        if (newer && entry.inode + 1 != *newer) return name + " is not the next older one";
        newer = entry.inode;
        ++found;
        const std::string& bytes = entry.file->bytes;
        if (!isLeftOf(generations.at(entry.inode - 1), bytes)) return name + " has foreign bytes";
        if (entry.inode == 1 && bytes.compare(0, line(0).size(), line(0)) != 0) {
            return name + " has lost what was on the disk";
        }
    }
    if (found != state.names.size()) return "there is a file of another name";
    const bool oldestIsGone = newer.value_or(0) != 1;
    if (order == NameOrder::OF_ALL && oldestIsGone && found < backups) {
        return "more than the oldest file is missing";
    }
    return "";
}

TEST_P(LogStates, AreWhatWasWrittenWithItsEndOrBlocksOfItMissing) {
    const History history = recordLogging();
    for (const NameOrder order : {NameOrder::OF_ALL, NameOrder::OF_EACH}) {
        const CrashStates states(history, bounds(order));
        for (const State& state : states.all())
            ASSERT_EQ(brokenPromise(state, generations(), GetParam().backups, order), "");
        const bool ofAll = order == NameOrder::OF_ALL;
        printStates(std::string("log, ") + GetParam().name + (ofAll ? ", names in order" : ""),
                    history, states, "what was written, its end or blocks of it missing");
    }
}

TEST_P(LogStates, LetTheNextProgramLogOn) {
    const History history = recordLogging();
    const CrashStates states(history, bounds(NameOrder::OF_EACH));
    const std::size_t wanted = isThorough() ? 2000 : 40;
    const std::size_t step = std::max<std::size_t>(1, states.all().size() / wanted);
    std::size_t tried = 0;
    for (std::size_t i = 0; i < states.all().size(); i += step, ++tried) {
        const State& state = states.all()[i];
        makeDirectory(state, _dir.path());
        const auto log = state.names.find("log");
        const std::string before = log == state.names.end() ? "" : log->second.file->bytes;
        ASSERT_EQ(testsupport::runInChild([&] { return logLines(7000, 7001); }).status, 0);
        const bool isRotated =
            before.size() + line(0).size() >= line(0).size() * GetParam().linesAFile;
        if (isRotated && GetParam().backups == 0) continue;  // and so gone
        ASSERT_EQ(bytesOf(_dir.file(isRotated ? "log.1" : "log")), before + line(7000));
    }
    EXPECT_GE(tried, std::min(wanted, states.all().size()) / 2);
}

// The rotation in the wrong order, and a byte that was never logged.
TEST_P(LogStates, ShowWhatIsWrong) {
    History history = recordLogging();
    const auto isBroken = [&] {
        const CrashStates states(history, bounds(NameOrder::OF_ALL));
        return std::any_of(states.all().begin(), states.all().end(), [&](const State& state) {
            return !brokenPromise(state, generations(), GetParam().backups, NameOrder::OF_ALL)
                        .empty();
        });
    };
    if (GetParam().backups > 0) {
        const History right = history;
        const auto movesUp = [](const Event& event) {
            return isA<Rename>(event) && std::get<Rename>(event).from == "log.1";
        };
        const auto first = std::find_if(history.events.begin(), history.events.end(), movesUp);
        ASSERT_TRUE(first != history.events.end());
        std::iter_swap(first, first + 1);
        history.events.erase(first + 2, history.events.end());
        EXPECT_TRUE(isBroken());
        history = right;
    }
    history.events.push_back(Write{1, 0, "M"});
    EXPECT_TRUE(isBroken());
}

INSTANTIATE_TEST_SUITE_P(LogStates, LogStates,
                         testing::Values(Shape{"without rotation", 3, 1000, 0, 7},
                                         Shape{"rotated without backups", 5, 2, 0, 9},
                                         Shape{"rotated with two backups", 6, 2, 2, 10}),
                         [](const auto& shape) {
                             std::string name = shape.param.name;
                             std::replace(name.begin(), name.end(), ' ', '_');
                             return name;
                         });

}  // namespace
