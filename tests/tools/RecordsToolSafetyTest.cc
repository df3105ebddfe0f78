#include <korvex/util/Pathname.h>

#include <sys/ptrace.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>

#include <csignal>
#include <ostream>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;

class SafetyTest : public RecordsToolTest {
  protected:
    // Runs the tool and kills it at its k-th stop, each system call being two; true when it had
    // come to its end before.
    bool runUntilStop(int k, const std::vector<std::string>& arguments) const {
        const pid_t pid = fork();
        if (pid == 0) {
            ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
            dup2(open("/dev/null", O_RDWR), 2);
            execTool(arguments);
        }
        int status = 0;
        while (waitpid(pid, &status, 0) == pid && WIFSTOPPED(status)) {
            if (--k < 0) kill(pid, SIGKILL);
            ptrace(PTRACE_SYSCALL, pid, nullptr, nullptr);
        }
        return WIFEXITED(status);
    }
};

struct Writing {
    const char* name;
    std::vector<std::string> arguments;
    std::vector<std::pair<std::string, std::string>> after;

    friend void PrintTo(const Writing& writing, std::ostream* out) { *out << writing.name; }
};

class KilledWriting : public SafetyTest, public testing::WithParamInterface<Writing> {};

TEST_P(KilledWriting, LeavesTheOldFileOrTheNewOneAndTheNextRunFindsIt) {
    if (isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    const std::string before = fileOf({{"a", "1"}, {"c", "3"}});
    const std::string after = fileOf(GetParam().after);
    writeFile(dir.file("dump"), "VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n");
    std::vector<std::string> arguments = GetParam().arguments;
    writeFile(dir.file("batch"), "put\tb\t2\nremove\ta\n");
    if (arguments[0] == "load") arguments.push_back(dir.file("dump"));
    if (arguments[0] == "batch") arguments.push_back(dir.file("batch"));
    bool ended = false;
    bool sawAfter = false;
    int k = 0;
    for (; !ended; ++k) {
        writeFile(data, before);
        ended = runUntilStop(k, arguments);
        const std::string left = stored();
        sawAfter = sawAfter || (!ended && left == after);
        ASSERT_TRUE(left == before || left == after) << "killed at stop " << k;
        if (k % 16 == 0) {
            ASSERT_EQ(run({"check"}).status, 0) << "killed at stop " << k;
        }
        ASSERT_LE(beside().size(), 2U) << "the next run tidies up";
        ASSERT_TRUE(stored() == left);
    }
    std::printf("[  killed  ] %s: %d times\n", GetParam().name, k - 1);
    EXPECT_TRUE(sawAfter);
    EXPECT_TRUE(stored() == after);
    EXPECT_THAT(beside(), ElementsAre("data")) << "the run that ended tidies up";
}

INSTANTIATE_TEST_SUITE_P(
    SafetyTest, KilledWriting,
    testing::Values(Writing{"put",
                            {"put", "b", std::string(9000, 'x')},
                            {{"a", "1"}, {"b", std::string(9000, 'x')}, {"c", "3"}}},
                    Writing{"remove", {"remove", "a", "c"}, {}},
                    Writing{"batch", {"batch"}, {{"b", "2"}, {"c", "3"}}},
                    Writing{"replace", {"load", "--replace"}, {{"b", "2"}}},
                    Writing{"load", {"load"}, {{"a", "1"}, {"b", "2"}, {"c", "3"}}}),
    [](const auto& writing) { return std::string(writing.param.name); });

TEST_F(SafetyTest, AFifoOrADeviceDoesNotHoldTheToolUp) {
    const std::string fifo = dir.file("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    const std::string zero = "/dev/zero";
    for (const char* verb : {"list", "check", "stats", "salvage"}) {
        EXPECT_EQ(run({"-f", fifo, verb}).status, 4);
        EXPECT_EQ(run({"-f", zero, verb}).status, 4);
    }
    for (const std::string& file : {fifo, zero, dir.path()}) {
        const ChildResult result = run({"-f", file, "put", "a", "1"});
        EXPECT_EQ(result.status, 4);
        EXPECT_EQ(result.err, "korvex-records: " + file + ": not a regular file\n");
    }
}

TEST_F(SafetyTest, AFileSizeLimitIsAFailedSaveAndNoDeath) {
    EXPECT_EQ(run({"put", "a", std::string(3000, 'x')}).status, 0);
    const std::string before = stored();
    std::vector<rlim_t> limits{1000, 3050, 6000};
#ifndef __SANITIZE_THREAD__  // whose runtime itself dies of a limit of 0 before main begins
    limits.push_back(0);
#endif
    for (const rlim_t limit : limits) {
        const ChildResult result = run({"put", "b", std::string(5000, 'y')}, "", [limit] {
            const struct rlimit both = {limit, limit};
            setrlimit(RLIMIT_FSIZE, &both);
            dup2(open("/dev/null", O_WRONLY), 2);
        });
        EXPECT_EQ(result.status, 4) << limit;
        EXPECT_TRUE(stored() == before);
        EXPECT_THAT(beside(), ElementsAre("data"));
    }
}

TEST_F(SafetyTest, AFailedFirstSaveLeavesNoFile) {
    EXPECT_EQ(run({"put", "b", std::string(5000, 'y')}, "",
                  [] {
                      const struct rlimit limits = {4000, 4000};
                      setrlimit(RLIMIT_FSIZE, &limits);
                      dup2(open("/dev/null", O_WRONLY), 2);
                  })
                  .status,
              4);
    EXPECT_THAT(beside(), testing::IsEmpty());
}

TEST_F(SafetyTest, ASaveKeepsTheModeAndFollowsLinks) {
    writeFile(dir.file("real"), fileOf({{"a", "1"}}));
    ASSERT_EQ(chmod(dir.file("real").c_str(), 0640), 0);
    std::filesystem::create_symlink(dir.file("real"), data);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_TRUE(std::filesystem::is_symlink(data));
    struct stat st;
    ASSERT_EQ(stat(data.c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 07777U, 0640U);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {"b", "2"}}));
}

TEST_F(SafetyTest, ANewFileIsForItsOwnerOnly) {
    EXPECT_EQ(run({"put", "b", "2"}, "", [] { umask(0); }).status, 0);
    struct stat st;
    ASSERT_EQ(stat(data.c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 07777U, 0600U);
}

TEST_F(SafetyTest, InputThatCannotBeReadIsNoEmptyInput) {
    const auto closed = [] { close(0); };
    const auto directory = [this] { dup2(open(dir.path().c_str(), O_RDONLY), 0); };
    for (const std::function<void()>& prepare : {std::function<void()>(closed), {directory}}) {
        EXPECT_EQ(run({"put", "k", "-"}, "", prepare).status, 4);
        EXPECT_EQ(run({"load"}, "", prepare).status, 4);
    }
    EXPECT_EQ(run({"put", "-i", dir.path(), "k"}).status, 4);
    EXPECT_EQ(run({"load", dir.path()}).status, 4);
    EXPECT_THAT(beside(), testing::IsEmpty());
}

TEST_F(SafetyTest, ClosedStreamsHarmNothing) {
    const auto allClosed = [] {
        for (const int fd : {0, 1, 2})
            close(fd);
    };
    EXPECT_EQ(run({"put", "a", "1"}, "", allClosed).status, 0);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}}));
    EXPECT_EQ(run({"list"}, "", allClosed).status, 4);
    EXPECT_EQ(run({"get", "a"}, "", [] { close(1); }).status, 4);
    EXPECT_EQ(run({"put", "_record-file-version", "1"}, "", allClosed).status, 2);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}}));
    EXPECT_EQ(run({"get", "a"}, "", [] { close(2); }).out, "1");
    EXPECT_EQ(run({"get", "a"}, "", [] { dup2(open("/dev/full", O_WRONLY), 2); }).out, "1");
}

// A pipe that nobody reads.
void toNobody() {
    int ends[2];
    if (pipe(ends) != 0) _exit(99);
    dup2(ends[1], 1);
    close(ends[0]);
}

TEST_F(SafetyTest, AReaderThatIsGoneEndsReadingSilentlyByTheSignal) {
    EXPECT_EQ(run({"put", "a", std::string(100000, 'x')}).status, 0);
    writeFile(dir.file("other"), fileOf({}));
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"get", "a"},
                                               {"list"},
                                               {"dump"},
                                               {"check"},
                                               {"stats"},
                                               {"diff", dir.file("other")},
                                               {"salvage"},
                                               {"--help"}}) {
        const ChildResult result = run(arguments, "", [] {
            signal(SIGPIPE, SIG_DFL);
            toNobody();
        });
        EXPECT_EQ(result.signal, SIGPIPE) << arguments[0];
        EXPECT_EQ(result.err, "") << arguments[0];
    }
}

TEST_F(SafetyTest, WhoIgnoresTheSignalIsToldThatTheOutputIsLost) {
    writeFile(data, fileOf({{"a", "1"}}));
    const ChildResult result = run({"get", "a"}, "", [] {
        signal(SIGPIPE, SIG_IGN);
        toNobody();
    });
    EXPECT_EQ(result.status, 4);
    EXPECT_EQ(result.err, "korvex-records: standard output: Broken pipe\n");
}

TEST_F(SafetyTest, AReaderThatIsGoneEndsNoChange) {
    const auto nobodyReads = [] {
        signal(SIGPIPE, SIG_DFL);
        toNobody();
    };
    EXPECT_EQ(run({"batch"}, "put\ta\t1\n", nobodyReads).status, 4);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}}));
    EXPECT_EQ(run({"salvage", "-o", dir.file("fresh")}, "", nobodyReads).status, 4);
    EXPECT_EQ(readFile(dir.file("fresh")), stored());
}

TEST_F(SafetyTest, LostHelpIsNoticed) {
    EXPECT_THAT(run({"--help"}).out, HasSubstr("--create"));
    EXPECT_EQ(run({"--help"}).status, 0);
    EXPECT_EQ(run({"--help"}, "", [] { dup2(open("/dev/full", O_WRONLY), 1); }).status, 4);
}

}  // namespace
