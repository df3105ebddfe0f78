#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <ostream>
#include <string>
#include <vector>

#include "support/TempDir.h"
#include "support/Terminal.h"

// What the completed line prints tells what it had become.

namespace {

using namespace testsupport;

const std::string kFolder = KORVEX_SOURCE_DIR "/tools/korvex-logcheck/";

struct Shell {
    const char* name;
    std::vector<const char*> command;
    const char* setUp;

    friend void PrintTo(const Shell& shell, std::ostream* out) { *out << shell.name; }
};

const Shell kBash = {"bash",
                     {"bash", "--norc", "--noprofile", "-i"},
                     ". $COMPLETION/korvex-logcheck.bash; bind 'set bell-style none'"};
const Shell kZsh = {
    "zsh",
    {"zsh", "-f", "-i"},
    "fpath=($COMPLETION $fpath); autoload -U compinit; compinit -u -D; unsetopt beep"};

class LogcheckCompletionTest : public testing::TestWithParam<Shell> {
  protected:
    LogcheckCompletionTest() {
        std::filesystem::create_directories(dir.file("sub/etc"));
        writeFile(dir.file("a file.cfg"), "rootCategory=loud\n");
        writeFile(dir.file("sub/etc/log.cfg"), "rootCategory=quiet\n");
        _pid = fork();
        if (_pid == 0) becomeShell();
        enter(std::string(GetParam().setUp) + "; cd \"$HOME\"; echo rea''dy");
        expectShown("ready");
    }
    ~LogcheckCompletionTest() override {
        kill(_pid, SIGKILL);
        waitpid(_pid, nullptr, 0);
    }

    void enter(const std::string& line) const { _terminal.type(line + "\n"); }
    void expectShown(const std::string& text) {
        EXPECT_TRUE(_terminal.shows(text)) << "it shows:\n" << _terminal.seen();
    }
    void expectPrints(const std::string& line, const std::string& text) {
        _terminal.forget();
        enter(line);
        expectShown(text);
    }

    const TempDir dir;

  private:
    [[noreturn]] void becomeShell() const {
        alarm(100);
        _terminal.takeOver();
        const std::string tool = KORVEX_LOGCHECK;
        const std::string path = tool.substr(0, tool.rfind('/')) + ":" + std::getenv("PATH");
        setenv("PATH", path.c_str(), 1);
        setenv("COMPLETION", (kFolder + "completion").c_str(), 1);
        setenv("HOME", dir.path().c_str(), 1);
        setenv("INPUTRC", "/dev/null", 1);
        setenv("LC_ALL", "C.UTF-8", 1);
        setenv("TERM", "dumb", 1);
        setenv("PS1", "> ", 1);
        std::vector<const char*> argv = GetParam().command;
        argv.push_back(nullptr);
        execvp(argv[0], const_cast<char**>(argv.data()));
        _exit(127);
    }

    Terminal _terminal{200};
    pid_t _pid = -1;
};

TEST_P(LogcheckCompletionTest, Options) {
    expectPrints("korvex-logcheck --vers\t", "korvex-logcheck 1.");
    expectPrints("korvex-logcheck --cod\t", "bytes.crlf");
}

TEST_P(LogcheckCompletionTest, Files) {
    expectPrints("korvex-logcheck -q a\t", "a file.cfg:1:14: error");
    expectPrints("korvex-logcheck --json su\te\tl\t", "\"line\":1,");
}

TEST_P(LogcheckCompletionTest, DirectoriesAndUsersWhereTheyAreMeant) {
    writeFile(dir.file("sub/log.cfg"), "appender.A.fileName=${KORVEX_HOME}/x/\n");
    writeFile(dir.file("subtle"), "");
    expectPrints("korvex-logcheck --home su\t sub/log.cfg", "sub/x/");
    expectPrints("korvex-logcheck --home=su\t sub/log.cfg", "sub/x/");
    expectPrints("korvex-logcheck -q --paths --user nobo\t sub/etc/log.cfg", "error: Parse error");
}

INSTANTIATE_TEST_SUITE_P(In, LogcheckCompletionTest, testing::Values(kBash, kZsh),
                         [](const auto& shell) { return std::string(shell.param.name); });

// Neither forgets an option.
TEST(LogcheckCompletion, BothShellsKnowEachOptionOfTheHelp) {
    const std::string source = readFile(kFolder + "Options.cc");
    const std::string bash = readFile(kFolder + "completion/korvex-logcheck.bash");
    const std::string zsh = readFile(kFolder + "completion/_korvex-logcheck");
    const std::string page = readFile(kFolder + "korvex-logcheck.1");
    std::size_t count = 0;
    const std::size_t table = source.find("optionTable[] = {");
    const std::size_t end = source.find("\n};", table);
    for (std::size_t at = table; (at = source.find("\n    {\"", at)) < end; ++at) {
        const std::size_t name = at + 7;
        const std::string option = "--" + source.substr(name, source.find('"', name) - name);
        EXPECT_NE(bash.find(option), bash.npos) << option;
        EXPECT_NE(zsh.find(option), zsh.npos) << option;
        const std::string inPage = "\\-\\-" + option.substr(2);
        EXPECT_NE(page.find(inPage), page.npos) << option;
        ++count;
    }
    EXPECT_GE(count, 10U);
}

}  // namespace
