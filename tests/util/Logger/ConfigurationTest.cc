#include <korvex/util/Logger.h>

#include <gmock/gmock.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"

// The configuration file. It is read once per process, so each test reads its own in a child.

namespace {

using testing::ElementsAre;
using testing::MatchesRegex;
using testsupport::ChildResult;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::writeFile;

class ConfigurationTest : public testing::Test {
  protected:
    ConfigurationTest() : _conf(_dir.file("log.cfg")) {}

    // Standard error of a process that reads `config` and then runs `body`; the exit status tells
    // whether reading succeeded.
    std::string run(
        const std::string& config, const std::function<void()>& body = [] {}) {
        writeFile(_conf, config);
        const ChildResult result = runInChild([&] {
            const bool success = Logger::initialize(Pathname(_conf), Pathname(_dir.path()));
            body();
            return success ? 0 : 1;
        });
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.signal, 0);
        _success = result.status == 0;
        return result.err;
    }
    std::string parseError(int line, const std::string& quoted) const {
        return _conf + ":" + std::to_string(line) + ": Parse error at \"" + quoted + "\"\n";
    }
    std::string log(const char* name = "a.log") const { return readFile(_dir.file(name)); }

    // Two appenders A1 and A2 that write messages to a.log and b.log.
    static std::string twoAppenders() {
        return "appender.A1.fileName=${KORVEX_HOME}/a.log\nappender.A2.fileName=${KORVEX_HOME}/"
               "b.log\n";
    }
    static void debugAndWarn(const char* channel) {
        Logger logger(channel);
        logger.debug("%s debug", channel);
        logger.info("%s info", channel);
        logger.warn("%s warn", channel);
    }

    TempDir _dir;
    const std::string _conf;
    bool _success = false;
};

TEST_F(ConfigurationTest, TheFileIsClosedBeforeTheLogFilesAreOpened) {
    // The parse error is logged to the file before initialize() returns.
    writeFile(_conf, "nonsense\nrootCategory=INFO, A1\n" + twoAppenders());
    const ChildResult result = runInChild([&] {
        const int lowest = dup(STDIN_FILENO);
        close(lowest);
        Logger::initialize(Pathname(_conf), Pathname(_dir.path()));
        const std::string link = "/proc/self/fd/" + std::to_string(lowest);
        char target[4096] = "";
        return readlink(link.c_str(), target, sizeof target - 1) > 0 && target == _dir.file("a.log")
                   ? 0
                   : 1;
    });
    EXPECT_EQ(result.status, 0);
}

TEST_F(ConfigurationTest, EachMethodPassesItsOwnMinimumAndThoseBelow) {
    const std::vector<std::string> minima{"DEBUG", "INFO",  "NOTICE", "WARN", "ERROR",
                                          "CRIT",  "ALERT", "FATAL",  "EMERG"};
    const std::map<std::size_t, std::string> methods{{0, "debug"}, {1, "info"}, {3, "warn"},
                                                     {4, "error"}, {5, "crit"}, {7, "fatal"}};
    for (std::size_t minimum = 0; minimum < minima.size(); ++minimum) {
        EXPECT_EQ(run("rootCategory=" + minima[minimum] + ", A1\n" + twoAppenders(),
                      [] {
                          Logger logger("x");
                          logger.debug("%s", "debug");
                          logger.info("%s", "info");
                          logger.warn("%s", "warn");
                          logger.error("%s", "error");
                          logger.crit("%s", "crit");
                          logger.fatal("%s", "fatal");
                          logger.debug(std::string("debug"));
                          logger.info(std::string("info"));
                          logger.warn(std::string("warn"));
                          logger.error(std::string("error"));
                          logger.crit(std::string("crit"));
                          logger.fatal(std::string("fatal"));
                      }),
                  "");
        std::string expected;
        for (auto it = methods.lower_bound(minimum); it != methods.end(); ++it)
            expected += it->second + "\n";
        EXPECT_EQ(log(), expected + expected) << minima[minimum];
        std::remove(_dir.file("a.log").c_str());
    }
}

TEST_F(ConfigurationTest, AMissingFileLeavesTheDefaults) {
    const ChildResult result = runInChild([&] {
        const bool success = Logger::initialize(Pathname("/missing/log.cfg"), Pathname());
        debugAndWarn("x");
        return success ? 0 : 7;
    });
    EXPECT_EQ(result.status, 7);
    EXPECT_EQ(
        result.err,
        "Couldn't open log file configuration \"/missing/log.cfg\": No such file or directory\n"
        "x info\nx warn\n");
}

TEST_F(ConfigurationTest, AnEmptyFileLeavesTheDefaults) {
    EXPECT_EQ(run("", [] { debugAndWarn("x"); }), "x info\nx warn\n");
    EXPECT_TRUE(_success);
}

TEST_F(ConfigurationTest, ALevelAloneKeepsStandardError) {
    EXPECT_EQ(run("log4cpp.rootCategory=DEBUG", [] { debugAndWarn("x"); }),
              "x debug\nx info\nx warn\n");
}

TEST_F(ConfigurationTest, EarlyLoggersAreBoundToWhatTheFileSays) {
    writeFile(_conf, "category.net=DEBUG\n");
    const ChildResult result = runInChild([&] {
        Logger logger("net");
        Logger::initialize(Pathname(_conf), Pathname());
        logger.debug("bound");
        return 0;
    });
    EXPECT_EQ(result.err, "bound\n");
}

TEST_F(ConfigurationTest, ACategoryInheritsTheFinalRoot) {
    EXPECT_EQ(run("category.net=WARN\nrootCategory=DEBUG, A1\n" + twoAppenders() +
                      "category.own=A2\ncategory.both=NOTICE A2,A1\n",
                  [] {
                      for (const char* name : {"net", "own", "both"})
                          debugAndWarn(name);
                  }),
              "");
    EXPECT_EQ(log("a.log"), "net warn\nboth warn\n");
    EXPECT_EQ(log("b.log"), "own debug\nown info\nown warn\nboth warn\n");
}

TEST_F(ConfigurationTest, TheLastRootLineWins) {
    EXPECT_EQ(
        run(twoAppenders() + "rootCategory=DEBUG, A1\ncategory.net=WARN\nrootCategory=INFO,A2\n",
            [] { debugAndWarn("net"), debugAndWarn("x"); }),
        "");
    EXPECT_EQ(log("a.log"), "");
    EXPECT_EQ(log("b.log"), "net warn\nx info\nx warn\n");
}

TEST_F(ConfigurationTest, AnAppenderNamedTwiceWritesTwice) {
    run(twoAppenders() + "category.net=A1 A1", [] { Logger("net").warn("x"); });
    EXPECT_EQ(log(), "x\nx\n");
}

TEST_F(ConfigurationTest, ALevelWordNeverMeansAnAppender) {
    EXPECT_EQ(run("appender.WARN.fileName=${KORVEX_HOME}/a.log\ncategory.net=WARN\n",
                  [] { debugAndWarn("net"); }),
              "net warn\n");
}

TEST_F(ConfigurationTest, NamesAreFlat) {
    EXPECT_EQ(run("category.a.b=DEBUG\n", [] { debugAndWarn("a.b"), debugAndWarn("a"); }),
              "a.b debug\na.b info\na.b warn\na info\na warn\n");
}

TEST_F(ConfigurationTest, ANameLosesTrailingButNotLeadingBlanks) {
    EXPECT_EQ(run("category. a b \t = DEBUG\n", [] { Logger(" a b").debug("found"); }), "found\n");
    EXPECT_EQ(run("category.=DEBUG\n", [] { Logger("").debug("found"); }), "found\n");
}

TEST_F(ConfigurationTest, TheRootAppenderCanBeNamed) {
    EXPECT_EQ(
        run(twoAppenders() + "category.net=A1,rootAppender\n", [] { Logger("net").warn("x"); }),
        "x\n");
    EXPECT_EQ(log(), "x\n");
}

TEST_F(ConfigurationTest, BlanksAndCommentsDoNotMatterToWords) {
    for (const char* root :
         {"rootCategory=DEBUG, A1 # main", "rootCategory=DEBUG, A1   ",
          "\t rootCategory \t = DEBUG,,\tA1,\t", "log4cpp.rootCategory=A1 DEBUG\t#"}) {
        EXPECT_EQ(run(twoAppenders() + root, [] { Logger("x").debug("x"); }), "") << root;
        EXPECT_EQ(log(), "x\n") << root;
        std::remove(_dir.file("a.log").c_str());
    }
}

TEST_F(ConfigurationTest, ACommentSignThatTouchesAWordBelongsToIt) {
    EXPECT_EQ(
        run(twoAppenders() + "rootCategory=DEBUG, A1# main\n", [] { Logger("x").debug("x"); }),
        parseError(3, "DEBUG, A1#") + "x\n");
    EXPECT_TRUE(_success) << "errors in lines do not make reading fail";
}

TEST_F(ConfigurationTest, AValueKeepsOneTrailingBlank) {
    EXPECT_EQ(run("appender.A.fileName=${KORVEX_HOME}/x.log # old\n"), "");
    EXPECT_THAT(_dir.names(), ElementsAre("log.cfg", "x.log "));
    EXPECT_EQ(run("appender.A.fileName=${KORVEX_HOME}/y\t\t\n"), "");
    EXPECT_THAT(_dir.names(), ElementsAre("log.cfg", "x.log ", "y\t"));
    EXPECT_EQ(run("appender.A.maxFileSize=1000 \nappender.A.maxBackupIndex=0#\n"),
              "Appender \"A\" has no filename, assuming stderr\n" +
                  parseError(1, "appender.A.maxFileSize=1000 ") +
                  parseError(2, "appender.A.maxBackupIndex=0#"));
}

TEST_F(ConfigurationTest, ACarriageReturnIsAnOrdinaryCharacter) {
    EXPECT_EQ(run("rootCategory=DEBUG\r\n"), parseError(1, "DEBUG\r"));
}

TEST_F(ConfigurationTest, LinesWithoutContentAreSkipped) {
    EXPECT_EQ(run("\n  \t\n# comment\n  # comment\n#\n \t#x\nlog4cpp.\n"), "");
}

TEST_F(ConfigurationTest, WhatIsNoKnownKeyIsAParseError) {
    EXPECT_EQ(
        run("rootcategory=DEBUG\nCategory.x=DEBUG\nfoo\n  log4cpp.bar=1 \nlog4cpp.log4cpp.x=1\n"
            "category=1\nappender=1\ncategory x=1\n=1\n.x\nrootCategoryX=1\nx#y\n"
            "log4cpp. rootCategory=DEBUG\n"),
        parseError(1, "rootcategory=DEBUG") + parseError(2, "Category.x=DEBUG") +
            parseError(3, "foo") + parseError(4, "bar=1 ") + parseError(5, "log4cpp.x=1") +
            parseError(6, "category=1") + parseError(7, "appender=1") +
            parseError(8, "category x=1") + parseError(9, "=1") + parseError(10, ".x") +
            parseError(11, "rootCategoryX=1") + parseError(12, "x#") +
            parseError(13, " rootCategory=DEBUG"));
}

TEST_F(ConfigurationTest, ARootWithoutAnEqualsSignIsAParseError) {
    EXPECT_EQ(run("log4cpp.rootCategory\nrootCategory  DEBUG\nrootCategory.x=1\nrootCategory \n"),
              parseError(1, "rootCategory") + parseError(2, "rootCategory  DEBUG") +
                  parseError(3, "rootCategory.x=1") + parseError(4, "rootCategory "));
}

TEST_F(ConfigurationTest, ErrorsComeInOrderThenTheRootThenTheCategories) {
    EXPECT_EQ(
        run("category.b=nowhere\nrootCategory=gone, DEBUG\nfoo\ncategory.x\ncategory.=gone\nbar\n",
            [] { debugAndWarn("x"); }),
        parseError(3, "foo") + parseError(6, "bar") + parseError(2, "gone, DEBUG") +
            parseError(1, "b=nowhere") + parseError(4, "x") + parseError(5, "=gone") +
            "x debug\nx info\nx warn\n");
}

TEST_F(ConfigurationTest, ARejectedWordLeavesTheOthersInForce) {
    EXPECT_EQ(run(twoAppenders() + "category.net=gone DEBUG nowhere A1\n",
                  [] { Logger("net").debug("x"); }),
              parseError(3, "net=gone DEBUG nowhere A1"));
    EXPECT_EQ(log(), "x\n");
}

TEST_F(ConfigurationTest, AnAppenderLineWithAClassOnlyMakesIt) {
    EXPECT_EQ(run("appender.A1=FileAppender\nappender.A2 \t = anything at all\n"
                  "category.x=A1 A2 rootAppender\n"),
              "Appender \"A1\" has no filename, assuming stderr\n"
              "Appender \"A2\" has no filename, assuming stderr\n");
}

TEST_F(ConfigurationTest, AnAppenderExistsAlthoughItsLineFailed) {
    const auto warning = [](const char* name) {
        return std::string("Appender \"") + name + "\" has no filename, assuming stderr\n";
    };
    EXPECT_EQ(run("appender.A1.fileName\nappender.A2 x\nappender.A3 \nappender.A4.fileName x\n"
                  "appender.A5.nonsense=1\ncategory.x=A1,A2,A3,A4,A5\n"),
              warning("A1") + warning("A2") + warning("A3") + warning("A4") + warning("A5") +
                  parseError(1, "fileName") + parseError(2, "A2 x") + parseError(3, "A3 ") +
                  parseError(4, "appender.A4.fileName x") +
                  parseError(5, "appender.A5.nonsense=1"));
}

TEST_F(ConfigurationTest, AppenderLinesThatFailBeforeTheNameIsKnown) {
    EXPECT_EQ(
        run("  appender. A1.fileName=x\nappender.=x\nlog4cpp.appender.\nappender.A1\nappender.A1#\n"
            "appender.\tx\n"),
        parseError(1, "  appender. A1.fileName=x") + parseError(2, "appender.=x") +
            parseError(3, "") + parseError(4, "A1") + parseError(5, "A1#") +
            parseError(6, "appender.\tx"));
}

TEST_F(ConfigurationTest, AnEmptyAppenderNameBeforeADotIsAName) {
    EXPECT_EQ(run("appender..fileName=${KORVEX_HOME}/a.log\n"), "");
    EXPECT_THAT(_dir.names(), ElementsAre("a.log", "log.cfg"));
}

TEST_F(ConfigurationTest, AttributeErrorsQuoteTheAttributeOrTheLine) {
    EXPECT_EQ(run(" log4cpp.appender.A.fileName=${KORVEX_HOME}/a.log\nappender.A.maxFileSize\n"
                  " appender.A.maxFileSize 1\n  log4cpp.appender.A.maxFileSize = 010\n"
                  "appender.A.layout=NoLayout\nappender.A.x.y=1\n"),
              parseError(2, "maxFileSize") + parseError(3, " appender.A.maxFileSize 1") +
                  parseError(4, "  log4cpp.appender.A.maxFileSize = 010") +
                  parseError(5, "appender.A.layout=NoLayout") + parseError(6, "appender.A.x.y=1"));
}

TEST_F(ConfigurationTest, BlanksAroundTheEqualsSignOfAnAttributeAreSkipped) {
    EXPECT_EQ(run("appender.A1.fileName \t= \t${KORVEX_HOME}/a.log\n"
                  "appender.A1.layout.ConversionPattern =  [%m] %n\ncategory.x=A1\n",
                  [] { Logger("x").warn("y"); }),
              "");
    EXPECT_EQ(log(), "[y] \n");
}

TEST_F(ConfigurationTest, AFullConfigurationAsItIsUsed) {
    EXPECT_EQ(run("# logging of the command-line tools\n"
                  "log4cpp.rootCategory=INFO, MAIN\n"
                  "log4cpp.category.recordFileManager=DEBUG\n"
                  "<!-- not now:\nlog4cpp.category.Thread=DEBUG\n-->\n"
                  "log4cpp.appender.MAIN=RollingFileAppender\n"
                  "log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/a.log\n"
                  "log4cpp.appender.MAIN.maxFileSize=60\n"
                  "log4cpp.appender.MAIN.maxBackupIndex=2\n"
                  "log4cpp.appender.MAIN.layout=PatternLayout\n"
                  "log4cpp.appender.MAIN.layout.ConversionPattern=%-6p%c: %m%n\n",
                  [] {
                      Logger store("recordFileManager");
                      Logger thread("Thread");
                      for (int i = 0; i < 4; ++i) {
                          store.debug("message number %d", i);
                          thread.debug("dropped");
                      }
                  }),
              "");
    EXPECT_THAT(_dir.names(), ElementsAre("a.log", "a.log.1", "a.log.2", "log.cfg"));
    EXPECT_EQ(log("a.log.1"),
              "DEBUG recordFileManager: message number 2\n"
              "DEBUG recordFileManager: message number 3\n");
}

TEST_F(ConfigurationTest, CommentsMaySpanLinesAndJoinTheTextAroundThem) {
    EXPECT_EQ(run("\n\n<!-- a\nx=1\nb --> log4cpp.rootCategory=DEBUG\n", [] { debugAndWarn("x"); }),
              "x debug\nx info\nx warn\n");
    EXPECT_EQ(
        run("root<!-- a\n -->Category=<!--x-->DE<!---->BUG\n", [] { Logger("x").debug("x"); }),
        "x\n");
}

TEST_F(ConfigurationTest, AnErrorInJoinedTextCarriesTheLastLinesNumber) {
    EXPECT_EQ(run("foo<!--\n\n-->bar\nbaz\n"), parseError(3, "foobar") + parseError(4, "baz"));
}

TEST_F(ConfigurationTest, JoinedTextMayOpenANewComment) {
    EXPECT_EQ(run("a<!-- x -->b<!-<!-- y -->- hidden --> c\n"), parseError(1, "ab c"));
    EXPECT_EQ(run("<<!---->!-- hidden -->x\n"), parseError(1, "x"));
}

TEST_F(ConfigurationTest, AnyOtherAngleBracketIsContent) {
    EXPECT_EQ(run("a<b\n<!-x\n<! --x\n--> y\n"), parseError(1, "a<b") + parseError(2, "<!-x") +
                                                     parseError(3, "<! --x") +
                                                     parseError(4, "--> y"));
}

TEST_F(ConfigurationTest, ACommentSignHidesACommentStartAndACommentHidesTheSign) {
    EXPECT_EQ(run("# <!--\nfoo<!-- # -->bar\n"), parseError(2, "foobar"));
    EXPECT_TRUE(_success);
}

TEST_F(ConfigurationTest, TheShortestCommentNeedsItsOwnEnd) {
    EXPECT_EQ(run("<!-->x\n-->y\n"), parseError(2, "y"))
        << "the end does not share the start's dashes";
}

TEST_F(ConfigurationTest, AnUnterminatedCommentIsReportedAndMakesReadingFail) {
    EXPECT_EQ(run("rootCategory=DEBUG\n\nfoo <!-- begun\nx=1\n", [] { Logger("x").debug("x"); }),
              _conf + ":3: Unterminated XML comment started\n" + parseError(4, "foo ") + "x\n");
    EXPECT_FALSE(_success);
    EXPECT_EQ(run("rootCategory=DEBUG<!--", [] { Logger("x").debug("x"); }),
              _conf + ":1: Unterminated XML comment started\nx\n");
}

TEST_F(ConfigurationTest, LinesOfAnyLengthAreRead) {
    for (const std::size_t n : {126U, 127U, 128U, 254U, 255U, 256U, 1000000U}) {
        const std::string text(n, 'x');
        EXPECT_EQ(run(text + "\ny"), parseError(1, text) + parseError(2, "y")) << n;
    }
}

TEST_F(ConfigurationTest, ANulEndsThePieceInWhichItIsRead) {
    // What follows the NUL up to the newline is dropped, and the newline with it.
    EXPECT_EQ(run(std::string("foo\0bar\nbaz\nx\n", 14)),
              parseError(1, "foobaz") + parseError(2, "x"));
}

TEST_F(ConfigurationTest, ThreeHundredThousandCommentsOnOneLineTakeLinearTime) {
    std::string line;
    for (int i = 0; i < 300000; ++i)
        line += "a<!---->";
    EXPECT_EQ(run(line), parseError(1, std::string(300000, 'a')));
}

TEST_F(ConfigurationTest, FinalSetupRunsInTheOrderOfTheNames) {
    EXPECT_EQ(run("appender.b=\nappender.a=\nappender.C=\n"),
              "Appender \"C\" has no filename, assuming stderr\n"
              "Appender \"a\" has no filename, assuming stderr\n"
              "Appender \"b\" has no filename, assuming stderr\n");
}

TEST_F(ConfigurationTest, TheChannelLoggerReceivesTheReports) {
    EXPECT_EQ(run(twoAppenders() + "category.Logger=A2\nfoo\n"), "");
    EXPECT_EQ(log("b.log"), parseError(4, "foo"));
    EXPECT_EQ(run(twoAppenders() + "category.Logger=ERROR\nfoo\n"), "");
}

TEST_F(ConfigurationTest, TheRootAppendersAttributesLeaveItWhereItIs) {
    EXPECT_EQ(run("appender.rootAppender.fileName=${KORVEX_HOME}/a.log\n"
                  "appender.rootAppender.maxFileSize=1\n"
                  "appender.rootAppender.layout=SimpleLayout\n",
                  [] {
                      Logger("x").warn("one");
                      Logger("x").warn("two");
                  }),
              "WARN    : one\nWARN    : two\n");
    EXPECT_THAT(_dir.names(), ElementsAre("log.cfg"));
}

TEST_F(ConfigurationTest, ReadingAfterInitialisationIsAnAssertion) {
    writeFile(_conf, "");
    const ChildResult result = runInChild([&] {
        Logger::initialize();
        Logger::initialize(Pathname(_conf), Pathname());
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(
        result.err,
        MatchesRegex("src/util/Logger/.*:[0-9]+: failed assertion `!logger_initialized'\n"));
}

TEST_F(ConfigurationTest, ADirectoryInPlaceOfTheFileIsAnEmptyConfiguration) {
    const ChildResult result =
        runInChild([&] { return Logger::initialize(Pathname(_dir.path()), Pathname()) ? 0 : 1; });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

}  // namespace
