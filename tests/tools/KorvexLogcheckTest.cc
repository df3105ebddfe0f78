#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "support/Terminal.h"
#include "tools/LogcheckTool.h"

namespace {

using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;
using testing::StartsWith;
using testsupport::ChildResult;
using testsupport::execLogcheck;
using testsupport::LogcheckToolTest;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::Terminal;
using testsupport::writeFile;

using KorvexLogcheckTest = LogcheckToolTest;

const std::string kTwoAppenders =
    "log4cpp.rootCategory=INFO, MAIN   # for every other channel\n"
    "log4cpp.category.net=DEBUG\n"
    "log4cpp.category.audit=WARN, AUDIT, MAIN\n"
    "log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/main.log\n"
    "log4cpp.appender.MAIN.maxFileSize=1000\n"
    "log4cpp.appender.MAIN.maxBackupIndex=5\n"
    "log4cpp.appender.MAIN.layout=SimpleLayout\n"
    "log4cpp.appender.AUDIT.fileName=/var/audit.log\n"
    "log4cpp.appender.AUDIT.layout.ConversionPattern=[%c] %-5p %m%n\n";

TEST_F(KorvexLogcheckTest, ACleanConfigurationIsShownWhole) {
    const ChildResult result = check(kTwoAppenders, {"--home", "/opt/x"});
    EXPECT_EQ(result.out,
              "root\n"
              "  level   INFO and above\n"
              "  to      MAIN\n"
              "\n"
              "category net\n"
              "  level   DEBUG and above\n"
              "  to      MAIN\n"
              "\n"
              "category audit\n"
              "  level   WARN and above\n"
              "  to      AUDIT, MAIN\n"
              "\n"
              "appender MAIN\n"
              "  file    /opt/x/log/main.log\n"
              "  limits  beyond 1000 bytes the file is rotated; 5 backups are kept: main.log.1 "
              "(newest) to main.log.5\n"
              "  layout  %-8p: %m%n\n"
              "  sample  INFO    : this is a message\n"
              "  used by the root, net, audit\n"
              "\n"
              "appender AUDIT\n"
              "  file    /var/audit.log\n"
              "  limits  none: the file is never rotated\n"
              "  layout  [%c] %-5p %m%n\n"
              "  sample  [audit] WARN  this is a message\n"
              "  used by audit\n"
              "\n"
              "no errors, no warnings\n");
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.status, 0);
}

TEST_F(KorvexLogcheckTest, AnEmptyFileMeansTheRootOnStandardError) {
    EXPECT_EQ(check("").out,
              "root\n"
              "  level   INFO and above\n"
              "  to      rootAppender (standard error)\n"
              "\n"
              "appender rootAppender\n"
              "  file    standard error\n"
              "  limits  none\n"
              "  layout  %m%n\n"
              "  sample  this is a message\n"
              "  used by the root\n"
              "\n"
              "no errors, no warnings\n");
}

// By the clock on the wall, whatever the zone, so that a sample in a review or a test stays.
TEST_F(KorvexLogcheckTest, ASampleHasAFixedTimeAndShowsEachOfItsLines) {
    configure(
        "rootCategory=ERROR,A\nappender.A.fileName=/a\n"
        "appender.A.layout.ConversionPattern=%d [%t] %R %-6r|%08u|%.2r%%%n%p: %m%n\n");
    for (const char* const zone : {"UTC", "Asia/Tokyo", "EST5EDT"}) {
        const ChildResult result = runInChild([&] {
            setenv("TZ", zone, 1);
            execLogcheck({file});
            return 127;
        });
        EXPECT_THAT(result.out, HasSubstr("  sample  2007-03-05 14:03:09,007 [Main Thread] 2 2500  "
                                          "|00010000|25%\n          ERROR: this is a message\n"));
    }
}

TEST_F(KorvexLogcheckTest, TheHomeComesFromTheOptionElseFromTheEnvironment) {
    configure("rootCategory=INFO,A\nappender.A.fileName=${KORVEX_HOME}/a.log\n");
    const auto withHome = [&](const std::vector<std::string>& arguments) {
        return runInChild([&] {
                   setenv("KORVEX_HOME", "/env//home/", 1);
                   execLogcheck(arguments);
                   return 127;
               })
            .out;
    };
    EXPECT_THAT(withHome({file}), HasSubstr("file    /env/home/a.log\n"));
    EXPECT_THAT(withHome({"--home=/opt", file}), HasSubstr("file    /opt/a.log\n"));
    const ChildResult without = run({file});
    EXPECT_THAT(without.out, HasSubstr("file    ${KORVEX_HOME}/a.log\n"));
    EXPECT_EQ(without.status, 0);
}

TEST_F(KorvexLogcheckTest, OneBackupAndNoneAreSaidInTheirOwnWords) {
    const std::string start = "rootCategory=INFO,A\nappender.A.fileName=/a\n";
    EXPECT_THAT(check(start + "appender.A.maxFileSize=7\nappender.A.maxBackupIndex=1\n").out,
                HasSubstr("beyond 7 bytes the file is rotated; 1 backup is kept: a.1\n"));
    EXPECT_THAT(check(start + "appender.A.maxFileSize=7\n").out,
                HasSubstr("beyond 7 bytes the file starts again empty; no backup is kept\n"));
}

TEST_F(KorvexLogcheckTest, AChannelOfACategoryGetsWhatItsLevelLetsPass) {
    const ChildResult result = check(kTwoAppenders, {"--channel", "audit", "--home", "/opt/x"});
    const std::string both = "AUDIT (/var/audit.log), MAIN (/opt/x/log/main.log)\n";
    EXPECT_EQ(result.out,
              "channel audit\n  DEBUG   dropped\n  INFO    dropped\n"
              "  NOTICE  dropped\n  WARN    " +
                  both + "  ERROR   " + both + "  CRIT    " + both + "  ALERT   " + both +
                  "  FATAL   " + both + "  EMERG   " + both + "\nno errors, no warnings\n");
    EXPECT_EQ(result.status, 0);
}

TEST_F(KorvexLogcheckTest, AChannelWithoutACategoryIsTheRoots) {
    EXPECT_THAT(check("rootCategory=FATAL\n", {"--channel=no.such"}).out,
                AllOf(StartsWith("channel no.such: no category of its own, so the root's\n"),
                      HasSubstr("  ALERT   dropped\n"
                                "  FATAL   rootAppender (standard error)\n"
                                "  EMERG   rootAppender (standard error)\n")));
}

TEST_F(KorvexLogcheckTest, AChannelKeepsTheStatusOfTheWholeFile) {
    EXPECT_EQ(check("nonsense\n", {"--channel", "a"}).status, 2);
    EXPECT_EQ(check("appender.A.fileName=/a\n", {"--channel", "a"}).status, 1);
}

// Names, kinds, contents and times of change of all that is below the directory.
std::map<std::string, std::vector<std::string>> stateOf(const std::string& root) {
    std::map<std::string, std::vector<std::string>> state;
    const auto note = [&](const std::string& path) {
        struct stat st {};
        EXPECT_EQ(lstat(path.c_str(), &st), 0) << path;
        state[path] = {std::to_string(st.st_mode), std::to_string(st.st_size),
                       std::to_string(st.st_mtim.tv_sec) + '.' + std::to_string(st.st_mtim.tv_nsec),
                       std::to_string(st.st_ctim.tv_sec) + '.' + std::to_string(st.st_ctim.tv_nsec),
                       S_ISREG(st.st_mode) ? readFile(path) : ""};
    };
    note(root);
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root))
        note(entry.path().string());
    return state;
}

TEST_F(KorvexLogcheckTest, NothingIsCreatedOrChanged) {
    ASSERT_EQ(mkdir(dir.file("log").c_str(), 0700), 0);
    writeFile(dir.file("log/main.log"), std::string(2000, 'x'));
    configure(kTwoAppenders + "log4cpp.appender.NEW.fileName=" + dir.file("log/new.log") + "\n");
    const auto before = stateOf(dir.path());
    const ChildResult result = run({file, "--home", dir.path()});
    EXPECT_THAT(result.out, HasSubstr(dir.file("log/new.log")));
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(stateOf(dir.path()), before);
}

TEST_F(KorvexLogcheckTest, WhatCannotBeReadIsStatusTwo) {
    const ChildResult missing = run({dir.file("none")});
    EXPECT_EQ(missing.err,
              "korvex-logcheck: cannot read " + dir.file("none") + ": No such file or directory\n");
    EXPECT_EQ(missing.out, "");
    EXPECT_EQ(missing.status, 2);
    const ChildResult directory = run({dir.path()});
    EXPECT_EQ(directory.err, "korvex-logcheck: cannot read " + dir.path() + ": Is a directory\n");
    EXPECT_EQ(directory.status, 2);
}

TEST_F(KorvexLogcheckTest, WrongUsageIsStatusTwo) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{},
                                               {"--nonsense", "a"},
                                               {"a", "--home"},
                                               {"a", "--channel"},
                                               {"a", "--user", "root"},
                                               {"a", "--fix", "--json"},
                                               {"a", "-q", "--json"},
                                               {"a", "--channel", "x", "--json"},
                                               {"a", "--codes"}}) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_THAT(result.err, StartsWith("korvex-logcheck: "));
        EXPECT_EQ(result.out, "");
    }
}

TEST_F(KorvexLogcheckTest, QuietShowsTheFindingsOnlyAndNothingWithoutAny) {
    EXPECT_EQ(check(kTwoAppenders, {"-q"}).out, "");
    const ChildResult result = check(kTwoAppenders + "category.x=debug\n", {"--quiet"});
    EXPECT_EQ(result.out, file +
                              ":10:12: error: Parse error at \"x=debug\": \"debug\" is neither "
                              "a level nor an appender; levels are in upper case; did you mean "
                              "\"DEBUG\"? [level.case]\n");
    EXPECT_EQ(result.status, 2);
}

TEST_F(KorvexLogcheckTest, JsonIsAFindingALine) {
    const ChildResult result =
        check("rootCategory=debug, \"\\\x1b\ncategory.x=NOTICE\ncategory.y=EMERG\n", {"--json"});
    EXPECT_EQ(
        result.out,
        "{\"file\":\"" + file +
            "\",\"line\":1,\"column\":14,\"severity\":\"error\",\"code\":\"level.case\","
            "\"message\":\"Parse error at \\\"debug, \\\"\\\\\\\\x1b\\\": \\\"debug\\\" is neither "
            "a "
            "level nor an appender; levels are in upper case\",\"meant\":\"DEBUG\"}\n"
            "{\"file\":\"" +
            file +
            "\",\"line\":1,\"column\":21,\"severity\":\"error\",\"code\":\"word.unknown\","
            "\"message\":\"Parse error at \\\"debug, \\\"\\\\\\\\x1b\\\": \\\"\\\"\\\\\\\\x1b\\\" "
            "is neither "
            "a level nor an appender; the root names no appender that exists, so it writes to "
            "rootAppender\",\"meant\":null}\n"
            "{\"file\":\"" +
            file +
            "\",\"line\":1,\"column\":23,\"severity\":\"warning\",\"code\":\"bytes.control\","
            "\"message\":\"a control character, \\\\x1b: it is used as it "
            "stands\",\"meant\":null}\n"
            "{\"file\":\"" +
            file +
            "\",\"line\":2,\"column\":12,\"severity\":\"note\",\"code\":\"level.unused\","
            "\"message\":\"nothing is logged at NOTICE: it lets pass what WARN does\",\"meant\":"
            "\"WARN\"}\n"
            "{\"file\":\"" +
            file +
            "\",\"line\":3,\"column\":12,\"severity\":\"warning\",\"code\":\"level.silent\","
            "\"message\":\"nothing is logged at EMERG: category \\\"y\\\" is silent, FATAL "
            "messages "
            "included\",\"meant\":null}\n");
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(check(kTwoAppenders, {"--json"}).out, "");
}

TEST_F(KorvexLogcheckTest, AMinusSignIsStandardInput) {
    writeFile(file, "rootCategory=debug\n");
    const auto fromInput = [&](const std::vector<std::string>& arguments) {
        return runInChild([&] {
            dup2(open(file.c_str(), O_RDONLY), STDIN_FILENO);
            execLogcheck(arguments);
            return 127;
        });
    };
    const ChildResult told = fromInput({"-q", "-"});
    EXPECT_THAT(told.out, StartsWith("-:1:14: error: Parse error at \"debug\""));
    EXPECT_EQ(told.status, 2);
    EXPECT_EQ(fromInput({"--fix", "-"}).out, "rootCategory=DEBUG\n");
}

TEST_F(KorvexLogcheckTest, SeveralFilesDoNotMixAndTheWorstOneIsTheStatus) {
    const std::string other = dir.file("other.cfg");
    configure(
        "rootCategory=DEBUG, A\nappender.A.fileName=/a\nappender.A.layout=SimpleLayout\n"
        "category.x=A\nappender.rootAppender.layout=BasicLayout\n");
    writeFile(other, "category.y=A\n");
    const ChildResult result = run({file, other, dir.file("none")});
    const std::size_t second = result.out.find("configuration " + other + "\n\nroot\n");
    EXPECT_THAT(result.out, StartsWith("configuration " + file + "\n\nroot\n"));
    ASSERT_NE(second, result.out.npos);
    EXPECT_EQ(result.out.substr(second),
              "configuration " + other +
                  "\n\nroot\n  level   INFO and above\n  to      rootAppender (standard error)\n"
                  "\ncategory y\n  level   INFO and above\n"
                  "  to      rootAppender (standard error)\n\nappender rootAppender\n"
                  "  file    standard error\n  limits  none\n  layout  %m%n\n"
                  "  sample  this is a message\n  used by the root, y\n\n" +
                  other +
                  ":1:12: error: Parse error at \"y=A\": \"A\" is neither a level nor an appender; "
                  "the category names no appender that exists, so it writes to rootAppender "
                  "[word.unknown]\n1 error, 0 warnings\n");
    EXPECT_EQ(result.err,
              "korvex-logcheck: cannot read " + dir.file("none") + ": No such file or directory\n");
    EXPECT_EQ(result.status, 2);
    writeFile(other, "category.y=EMERG\n");
    EXPECT_EQ(run({"-q", file, other}).status, 1);
    EXPECT_EQ(run({"-q", other, file}).status, 1);
}

TEST_F(KorvexLogcheckTest, StandardInputIsReadOnce) {
    const ChildResult result = run({"-", "-"});
    EXPECT_EQ(result.err, "korvex-logcheck: standard input can be read once only\n");
    EXPECT_EQ(result.status, 2);
}

// Thousands of words are told one by one, each with the beginning of the line.
TEST_F(KorvexLogcheckTest, ALongLineIsNotQuotedWhole) {
    std::string line = "rootCategory=";
    for (int i = 0; i < 5000; ++i)
        line += "no ";
    const ChildResult result = check(line + '\n', {"-q"});
    EXPECT_EQ(testsupport::outputLines(result.out).size(), 5000U);
    EXPECT_LT(result.out.size(), 5000U * 1000);
    EXPECT_THAT(result.out, HasSubstr(" no no...\": \"no\" is neither"));
    const std::string umlauts = "x\xC3\xA4";
    std::string long_word;
    for (int i = 0; i < 400; ++i)
        long_word += umlauts;
    EXPECT_THAT(check(long_word + '\n', {"-q"}).out, Not(HasSubstr("\\x")));
}

TEST_F(KorvexLogcheckTest, AReaderThatIsGoneEndsItByTheSignal) {
    configure("x\n");
    for (const std::string option : {"-q", "--json", "--fix", "--paths"}) {
        const ChildResult result = runInChild([&] {
            int ends[2];
            if (pipe(ends) != 0) return 1;
            close(ends[0]);
            dup2(ends[1], STDOUT_FILENO);
            signal(SIGPIPE, SIG_DFL);
            execLogcheck({option, file});
            return 127;
        });
        EXPECT_EQ(result.signal, SIGPIPE) << option;
        EXPECT_EQ(result.err, "") << option;
    }
}

TEST_F(KorvexLogcheckTest, WhatIsNamedInAComplaintReachesNoTerminal) {
    EXPECT_EQ(run({"--no\033[31m", file}).err, "korvex-logcheck: --no\\x1b[31m: unknown option\n");
    EXPECT_EQ(run({"a\nb\x9b"}).err,
              "korvex-logcheck: cannot read a\\x0ab\\x9b: No such file or directory\n");
    EXPECT_EQ(run({""}).err, "korvex-logcheck: cannot read \"\": No such file or directory\n");
    const std::string odd = dir.file("e\033\n\xff.cfg");
    writeFile(odd, "x\n");
    for (const std::string option : {"-q", "--json", "--paths"}) {
        const ChildResult result = run({option, odd, odd});
        EXPECT_THAT(result.out, AllOf(HasSubstr("e\\"), Not(HasSubstr("\033"))));
    }
}

TEST_F(KorvexLogcheckTest, AFileWithoutAnEndIsNoConfiguration) {
    const ChildResult result = run({"/dev/zero"});
    EXPECT_EQ(result.err, "korvex-logcheck: cannot read /dev/zero: it is larger than 1 MiB\n");
    EXPECT_EQ(result.status, 2);
}

TEST_F(KorvexLogcheckTest, HelpAndVersionAreStatusZero) {
    EXPECT_THAT(run({"--version"}).out, MatchesRegex("korvex-logcheck [0-9.]+\n"));
    const ChildResult help = run({"--help"});
    EXPECT_THAT(help.out, AllOf(HasSubstr("[OPTION...] FILE..."), HasSubstr("--channel=NAME"),
                                HasSubstr("--home=DIR")));
    EXPECT_EQ(help.status, 0);
}

TEST_F(KorvexLogcheckTest, ALostOutputIsStatusTwo) {
    configure("");
    const ChildResult result = runInChild([&] {
        dup2(open("/dev/full", O_WRONLY), STDOUT_FILENO);
        execLogcheck({file});
        return 127;
    });
    EXPECT_EQ(result.err, "korvex-logcheck: standard output: No space left on device\n");
    EXPECT_EQ(result.status, 2);
}

// Runs the tool with a terminal as its standard output and gives what that shows.
std::string onTerminal(const std::string& file,
                       const std::vector<std::pair<std::string, std::string>>& environment) {
    Terminal terminal;
    runInChild([&] {
        setenv("TERM", "xterm", 1);
        unsetenv("NO_COLOR");
        for (const auto& [key, value] : environment)
            setenv(key.c_str(), value.c_str(), 1);
        terminal.becomes(STDOUT_FILENO);
        execLogcheck({file});
        return 127;
    });
    return terminal.shown();
}

TEST_F(KorvexLogcheckTest, ThereAreColoursOnATerminalOnly) {
    const std::string plain = check("x\n").out;
    EXPECT_THAT(plain, Not(HasSubstr("\033")));
    const std::string colourful = onTerminal(file, {});
    EXPECT_THAT(colourful, StartsWith("\033[1mroot\033[0m"));
    EXPECT_THAT(colourful, HasSubstr(":1:1: \033[1;31merror: \033[0mParse error"));
}

TEST_F(KorvexLogcheckTest, NoColorAndADumbTerminalAreRespected) {
    configure("x\n");
    EXPECT_THAT(onTerminal(file, {{"NO_COLOR", "1"}}), StartsWith("root\n"));
    EXPECT_THAT(onTerminal(file, {{"TERM", "dumb"}}), StartsWith("root\n"));
    EXPECT_THAT(onTerminal(file, {{"NO_COLOR", ""}}), StartsWith("\033[1m"));
}

TEST_F(KorvexLogcheckTest, NoControlCharacterOfTheFileReachesTheTerminal) {
    const std::string out = check(
                                "rootCategory=\033[2J\n"
                                "category.\033x=INFO\n"
                                "appender.\aA.fileName=/\b\n"
                                "appender.\aA.layout.ConversionPattern=\033[m%m\n"
                                "\033]0;\n")
                                .out;
    EXPECT_THAT(out, Not(testing::ContainsRegex("[\x01-\x09\x0b-\x1f\x7f]")));
    EXPECT_THAT(out, AllOf(HasSubstr("category \\x1bx\n"), HasSubstr("appender \\x07A\n"),
                           HasSubstr("file    /\\x08\n"), HasSubstr("layout  \\x1b[m%m\n"),
                           HasSubstr("sample  \\x1b[mthis is a message\n"),
                           HasSubstr(":5:1: error: Parse error at \"\\x1b]0;\"")));
}

}  // namespace
