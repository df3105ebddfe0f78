#include <sys/file.h>
#include <sys/wait.h>

#include <chrono>
#include <csignal>

#include "support/Terminal.h"
#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;
using testing::Not;

constexpr int kNone = -1;

class ProgressTest : public RecordsToolTest {
  protected:
    // The tool at work, its standard error a terminal.
    class Run {
      public:
        Run(const ProgressTest& test, const std::vector<std::string>& arguments, int in = kNone,
            int out = kNone)
            : _pid(fork()) {
            if (_pid != 0) return;
            alarm(60);
            terminal.becomes(STDERR_FILENO);
            if (in == kNone) in = open("/dev/null", O_RDONLY);
            if (out == kNone) out = open("/dev/null", O_WRONLY);
            dup2(in, STDIN_FILENO);
            dup2(out, STDOUT_FILENO);
            _exit(test.execTool(arguments));
        }
        int end() const {
            int status = -1;
            waitpid(_pid, &status, 0);
            return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
        }
        Terminal terminal{60};

      private:
        const pid_t _pid;
    };

    ProgressTest() {
        writeFile(data, fileOf({{"a", "1"}}));
        writeFile(dir.file("home/etc/log-cmdline.cfg"), "log4cpp.rootCategory=EMERG\n");
        writeFile(dir.file("dump"), "VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n");
    }
    // Keeps the tool's runs that write waiting.
    void holdLock() {
        _lock = open(data.c_str(), O_RDONLY | O_CLOEXEC);
        ASSERT_EQ(flock(_lock, LOCK_EX), 0);
    }
    void releaseLock() const {
        flock(_lock, LOCK_UN);
        close(_lock);
    }

  private:
    int _lock = -1;
};

// What stays to be seen.
std::string left(const std::string& shown) {
    std::vector<std::string> lines(1);
    std::size_t column = 0;
    for (const char c : shown) {
        if (c == '\n') lines.emplace_back();
        if (c == '\n' || c == '\r') {
            column = 0;
            continue;
        }
        std::string& line = lines.back();
        line.resize(std::max(line.size(), column + 1), ' ');
        line[column++] = c;
    }
    std::string screen;
    for (const std::string& line : lines)
        screen += line.substr(0, line.find_last_not_of(' ') + 1) + '\n';
    return screen;
}

TEST_F(ProgressTest, WaitingForMoreThanASecondIsShownAndTheLineIsGoneAtTheEnd) {
    writeFile(dir.file("batch"), "remove\ta\n");
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"put", "c", "3"},
                                               {"load", dir.file("dump")},
                                               {"remove", "b", "c"},
                                               {"batch", dir.file("batch")}}) {
        holdLock();
        const auto start = std::chrono::steady_clock::now();
        Run work(*this, arguments);
        EXPECT_TRUE(work.terminal.shows("waiting for another run [")) << arguments[0];
        EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
        releaseLock();
        EXPECT_EQ(work.end(), 0) << arguments[0];
        EXPECT_EQ(left(work.terminal.shown()), "\n") << arguments[0];
    }
    EXPECT_EQ(stored(), fileOf({}));
}

// Opening a file waits for whoever has a lease of it.
TEST_F(ProgressTest, EachReadingVerbShowsHowFarItIs) {
    std::signal(SIGIO, SIG_IGN);
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"check"}, {"list"}, {"get", "a"}, {"dump"}, {"stats"}, {"diff", data}, {"salvage"}}) {
        const int fd = open(data.c_str(), O_RDONLY | O_CLOEXEC);
        ASSERT_EQ(fcntl(fd, F_SETLEASE, F_WRLCK), 0);
        Run read(*this, arguments);
        EXPECT_TRUE(read.terminal.shows("\rreading [" + std::string(40, '.') + "]   0%"))
            << arguments[0];
        EXPECT_EQ(fcntl(fd, F_SETLEASE, F_UNLCK), 0);
        EXPECT_EQ(read.end(), 0);
        EXPECT_EQ(left(read.terminal.shown()), "\n");
        close(fd);
    }
    std::signal(SIGIO, SIG_DFL);
}

TEST_F(ProgressTest, LoadShowsThatItReadsItsInput) {
    int pipe[2];
    ASSERT_EQ(pipe2(pipe, O_CLOEXEC), 0);
    Run load(*this, {"load"}, pipe[0]);
    EXPECT_TRUE(load.terminal.shows("\rreading the input ["));
    const std::string dump = "VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n";
    EXPECT_EQ(write(pipe[1], dump.data(), dump.size()), static_cast<ssize_t>(dump.size()));
    close(pipe[1]);
    close(pipe[0]);
    EXPECT_EQ(load.end(), 0);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {"b", "2"}}));
}

TEST_F(ProgressTest, WhoTypesADumpIsNotDisturbed) {
    Terminal keyboard;
    Run typed(*this, {"load"}, open(keyboard.name().c_str(), O_RDONLY | O_NOCTTY | O_CLOEXEC));
    holdLock();
    Run other(*this, {"put", "c", "3"});
    ASSERT_TRUE(other.terminal.shows("waiting"));
    releaseLock();
    keyboard.type("VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n\004");
    EXPECT_EQ(typed.end(), 0);
    EXPECT_EQ(other.end(), 0);
    EXPECT_THAT(typed.terminal.shown(), Not(HasSubstr("reading the")));
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {"b", "2"}, {"c", "3"}}));
}

TEST_F(ProgressTest, WhatIsSaidMeanwhileStandsOnALineOfItsOwn) {
    holdLock();
    Run remove(*this, {"remove", "none"});
    ASSERT_TRUE(remove.terminal.shows("waiting"));
    releaseLock();
    EXPECT_EQ(remove.end(), 1);
    EXPECT_EQ(left(remove.terminal.shown()), "korvex-records: none: no such key\n\n");
}

TEST_F(ProgressTest, TheOutputOnTheSameTerminalStandsOnLinesOfItsOwn) {
    holdLock();
    Run load(*this, {"load", dir.file("dump")}, kNone, STDERR_FILENO);
    ASSERT_TRUE(load.terminal.shows("waiting"));
    releaseLock();
    EXPECT_EQ(load.end(), 0);
    EXPECT_EQ(left(load.terminal.shown()), "1 record added, 0 changed, 0 removed\n\n");
}

TEST_F(ProgressTest, WithoutATerminalNothingIsShown) {
    holdLock();
    const std::string err = dir.file("err");
    const pid_t pid = fork();
    if (pid == 0) {
        alarm(60);
        dup2(open("/dev/null", O_WRONLY), STDOUT_FILENO);
        dup2(open(err.c_str(), O_WRONLY | O_CREAT, 0600), STDERR_FILENO);
        _exit(execTool({"put", "b", "2"}));
    }
    Run later(*this, {"put", "c", "3"});
    ASSERT_TRUE(later.terminal.shows("waiting"));
    releaseLock();
    int status = -1;
    waitpid(pid, &status, 0);
    EXPECT_EQ(status, 0);
    EXPECT_EQ(later.end(), 0);
    EXPECT_THAT(readFile(err), Not(HasSubstr("waiting")));
}

}  // namespace
