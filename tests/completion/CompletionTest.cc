#include <sys/file.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstring>
#include <ostream>

#include "support/Terminal.h"
#include "tools/RecordsTool.h"

// Completion as a person has it: in a real shell on a terminal. What the completed line then prints
// was not typed, so it tells what the line had become.

namespace {

using namespace testsupport;

struct ShellKind {
    const char* name;
    std::vector<const char*> command;
    const char* setUp;

    friend void PrintTo(const ShellKind& kind, std::ostream* out) { *out << kind.name; }
};

const ShellKind kBash = {"bash",
                         {"bash", "--norc", "--noprofile", "-i"},
                         ". $COMPLETION/korvex-records.bash; bind 'set bell-style none'"};
const ShellKind kZsh = {
    "zsh",
    {"zsh", "-f", "-i"},
    "fpath=($COMPLETION $fpath); autoload -U compinit; compinit -u -D; unsetopt beep"};

class CompletionTest : public RecordsToolTest, public testing::WithParamInterface<ShellKind> {
  protected:
    CompletionTest() {
        writeFile(dir.file("home/etc/log-cmdline.cfg"), "log4cpp.rootCategory=EMERG\n");
        writeFile(data, fileOf({{"-minus", "value of minus"},
                                {"fruit/apple", "red as ever"},
                                {"fruit/banana", "yellow"},
                                {"it's $HOME `a`\\ \"b\"", "odd one"},
                                {"net:port", "8080"},
                                {"x=y", "equation"}}));
        writeFile(dir.file("other file"), fileOf({{"only there", "found it"}}));
        _pid = fork();
        if (_pid == 0) becomeShell();
        enter(std::string(GetParam().setUp) + "; cd \"$HOME\"; echo rea''dy");
        expectShown("ready");
    }
    ~CompletionTest() override {
        kill(_pid, SIGKILL);
        waitpid(_pid, nullptr, 0);
    }

    void type(const std::string& text) const { _terminal.type(text); }
    void enter(const std::string& line) const { type(line + "\n"); }
    void expectShown(const std::string& text) {
        EXPECT_TRUE(_terminal.shows(text)) << "it shows:\n" << _terminal.seen();
    }
    // The line's output, when it is complete, has that text.
    void expectPrints(const std::string& line, const std::string& text) {
        _terminal.forget();
        enter(line);
        expectShown(text);
    }
    // The line is thrown away.
    void expectStillThere() {
        _terminal.forget();
        enter("\025echo st''ill there");
        expectShown("still there");
    }

  private:
    [[noreturn]] void becomeShell() const {
        alarm(100);
        _terminal.takeOver();
        const std::string tool = KORVEX_RECORDS;
        const std::string path = tool.substr(0, tool.rfind('/')) + ":" + std::getenv("PATH");
        setenv("PATH", path.c_str(), 1);
        setenv("COMPLETION", KORVEX_SOURCE_DIR "/tools/korvex-records/completion", 1);
        setenv("HOME", dir.path().c_str(), 1);
        setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
        setenv("KORVEX_DB", dir.file("db").c_str(), 1);
        setenv("INPUTRC", "/dev/null", 1);
        setenv("LC_ALL", "C.UTF-8", 1);
        setenv("TERM", "xterm", 1);
        setenv("PS1", "> ", 1);
        std::vector<const char*> argv = GetParam().command;
        argv.push_back(nullptr);
        execvp(argv[0], const_cast<char**>(argv.data()));
        _exit(127);
    }

    Terminal _terminal{200};
    pid_t _pid = -1;
};

TEST_P(CompletionTest, VerbsAndOptions) {
    expectPrints("korvex-records st\t", "6 records");
    expectPrints("korvex-records --vers\t", "korvex-records 1.");
}

TEST_P(CompletionTest, KeysOfTheStore) {
    expectPrints("korvex-records get fruit/a\t", "red as ever");
    expectPrints("korvex-records -x get fruit/b\t", "79656c6c6f77");
}

TEST_P(CompletionTest, KeysThatSeveralShareAreListed) {
    type("korvex-records get fr\t\t\t");
    expectShown("fruit/apple");
    expectShown("fruit/banana");
    expectStillThere();
}

TEST_P(CompletionTest, KeysThatAWordBreakCuts) {
    expectPrints("korvex-records get net:p\t", "8080");
    expectPrints("korvex-records get x=\t", "equation");
}

TEST_P(CompletionTest, KeysThatTheShellWouldTakeApart) {
    expectPrints("korvex-records get it\t", "odd one");
    expectPrints("korvex-records get \"it\t", "odd one");
    expectPrints("korvex-records get 'it\t", "odd one");
    expectPrints("korvex-records get 'net:\t", "8080");
}

TEST_P(CompletionTest, KeysOfTheFileThatIsNamed) {
    expectPrints("korvex-records -f other\\ file get on\t", "found it");
    expectPrints("korvex-records --file='other file' get on\t", "found it");
    expectPrints("korvex-records -f oth\t get on\t", "found it");
}

TEST_P(CompletionTest, SeveralKeysAndOneWithAMinusSign) {
    expectPrints("korvex-records remove fruit/a\t net\t && korvex-records stats", "4 records");
    expectPrints("korvex-records get -- -m\t", "value of minus");
}

TEST_P(CompletionTest, FilesWhereAFileIsMeant) {
    expectPrints("korvex-records diff oth\t", "+ only there");
    writeFile(dir.file("dump"), "VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n");
    expectPrints("korvex-records load dum\t && korvex-records stats", "7 records");
}

TEST_P(CompletionTest, NewVerbsAndOptions) {
    writeFile(dir.file("lines"), "remove\tx=y\n");
    expectPrints("korvex-records bat\tlin\t && korvex-records stats", "5 records");
    expectPrints("korvex-records get --key-e\tnet\\\\3aport", "8080");
}

TEST_P(CompletionTest, AFileThatIsNotThereIsNotTouched) {
    type("korvex-records -f none get x\t");
    expectStillThere();
    EXPECT_NE(access(dir.file("none").c_str(), F_OK), 0);
}

TEST_P(CompletionTest, KeysAreReadWhileAnotherRunChangesTheFile) {
    const int lock = open(data.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(flock(lock, LOCK_EX), 0);
    expectPrints("korvex-records get fruit/a\t", "red as ever");
    close(lock);
}

INSTANTIATE_TEST_SUITE_P(In, CompletionTest, testing::Values(kBash, kZsh),
                         [](const auto& kind) { return std::string(kind.param.name); });

}  // namespace
