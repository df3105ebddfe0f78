#include <gmock/gmock.h>

#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testsupport::LogcheckToolTest;

using LogcheckKeysTest = LogcheckToolTest;

const std::string kLines =
    "lines are rootCategory=..., category.NAME=..., appender.NAME=... and "
    "appender.NAME.ATTRIBUTE=...";
const std::string kAttributes =
    "the attributes are fileName, maxFileSize, maxBackupIndex, layout and "
    "layout.ConversionPattern";

TEST_F(LogcheckKeysTest, AKeyInTheWrongCase) {
    EXPECT_THAT(
        findings(good + "rootcategory=INFO\n log4cpp.Category.net =INFO\nappender.A.filename=/b\n"
                        "Appender.A.Layout.conversionpattern=%m%n\n"),
        ElementsAre("3:1: error: Parse error at \"rootcategory=INFO\": upper and lower case "
                    "differ; did you mean \"rootCategory\"? [key.case]",
                    "4:2: error: Parse error at \"Category.net =INFO\": upper and lower case "
                    "differ; did you mean \"log4cpp.category.net\"? [key.case]",
                    "5:12: error: Parse error at \"appender.A.filename=/b\": " + kAttributes +
                        "; did you mean \"fileName\"? [key.case]",
                    "6:1: error: Parse error at \"Appender.A.Layout.conversionpattern=%m%n\": "
                    "upper and lower case differ; did you mean "
                    "\"appender.A.layout.ConversionPattern\"? [key.case]"));
    EXPECT_EQ(fixed("rootcategory=INFO\n log4cpp.Category.net =INFO\n"
                    "appender.rootAppender.Layout=SimpleLayout\n"),
              "rootCategory=INFO\n log4cpp.category.net =INFO\n"
              "appender.rootAppender.layout=SimpleLayout\n");
}

TEST_F(LogcheckKeysTest, APrefixOfAnotherLibrary) {
    const std::string reason =
        ": the prefix of a key is \"log4cpp.\", or there is none; did you mean \"";
    EXPECT_THAT(findings("log4j.rootCategory=INFO\nlog4cpp::category.x=INFO\n"
                         "LOG4CPP.log4cplus.category.y=INFO\n"),
                ElementsAre("1:1: error: Parse error at \"log4j.rootCategory=INFO\"" + reason +
                                "log4cpp.rootCategory\"? [key.prefix]",
                            "2:1: error: Parse error at \"log4cpp::category.x=INFO\"" + reason +
                                "log4cpp.category.x\"? [key.prefix]",
                            "3:1: error: Parse error at \"LOG4CPP.log4cplus.category.y=INFO\"" +
                                reason + "log4cpp.category.y\"? [key.prefix]"));
    EXPECT_EQ(fixed("log4j.rootCategory=INFO\nlog4cpp::category.x=INFO\nlog4cpp.category.y=INFO\n"
                    "log4j.log4j.category.z=INFO"),
              "log4cpp.rootCategory=INFO\nlog4cpp.category.x=INFO\nlog4cpp.category.y=INFO\n"
              "log4cpp.category.z=INFO");
}

TEST_F(LogcheckKeysTest, KeysAsOtherLibrariesCallThem) {
    EXPECT_THAT(
        codes("rootLogger=INFO\nlogger.net=INFO\nroot=INFO\n"
              "appender.rootAppender.ConversionPattern=%m%n\n"),
        ElementsAre("key.other-name", "key.other-name", "key.other-name", "key.other-name"));
    EXPECT_EQ(fixed(good + "log4j.logger.net=debug\nappender.A.MaxBackups=2\n"
                           "appender.A.maxSize=4096\n"),
              good +
                  "log4cpp.category.net=DEBUG\nappender.A.maxBackupIndex=2\n"
                  "appender.A.maxFileSize=4096\n");
    EXPECT_EQ(fixed("rootCategory=INFO,A\nappender.A.File=/a.log\n"), good.substr(0, 20) +
                                                                          "appender.A.fileName="
                                                                          "/a.log\n");
}

TEST_F(LogcheckKeysTest, AColonInsteadOfTheEqualsSign) {
    EXPECT_THAT(findings("rootCategory : INFO\n"),
                ElementsAre("1:1: error: Parse error at \"rootCategory : INFO\": a key ends with "
                            "\"=\"; did you mean \"rootCategory=\"? [key.colon]"));
    EXPECT_EQ(fixed("rootCategory : INFO, A\ncategory.net: DEBUG\nappender.A.fileName:/a.log\n"),
              "rootCategory = INFO, A\ncategory.net= DEBUG\nappender.A.fileName=/a.log\n");
}

TEST_F(LogcheckKeysTest, ThereIsNoAdditivity) {
    EXPECT_THAT(findings("log4cpp.additivity.net=false\n"),
                ElementsAre("1:1: error: Parse error at \"additivity.net=false\": there is no "
                            "additivity: names are flat, and a category that names an appender "
                            "writes to no other [key.additivity]"));
}

TEST_F(LogcheckKeysTest, LinesThatMeanNothing) {
    EXPECT_THAT(
        findings("rootCatgory=INFO\n// no comment\ncategory.x\nappender.=x\nrootCategory INFO\n"),
        ElementsAre("1:1: error: Parse error at \"rootCatgory=INFO\": " + kLines +
                        "; did you mean \"rootCategory\"? [key.unknown]",
                    "2:1: error: Parse error at \"// no comment\": a comment begins with \"#\" "
                    "[key.unknown]",
                    "3:1: error: Parse error at \"x\": there is no \"=\" where one belongs; " +
                        kLines + " [key.unknown]",
                    "4:1: error: Parse error at \"appender.=x\": the appender has no name; " +
                        kLines + " [key.unknown]",
                    "5:1: error: Parse error at \"rootCategory INFO\": there is no \"=\" where "
                    "one belongs; " +
                        kLines + " [key.unknown]"));
}

TEST_F(LogcheckKeysTest, AttributesThatThereAreNot) {
    const auto error = [&](const std::string& line) {
        return "error: Parse error at \"" + line + "\": " + kAttributes;
    };
    EXPECT_THAT(
        findings(good + "appender.A.fileNmae=/b\nappender.A.Threshold=INFO\n"
                        "appender.A.append=true\nappender.A.datePattern=x\n"
                        "appender.rootAppender.target=System.err\n"),
        ElementsAre("3:12: " + error("appender.A.fileNmae=/b") +
                        "; did you mean \"fileName\"? [attribute.unknown]",
                    "4:12: " + error("appender.A.Threshold=INFO") +
                        "; a category has a level, an appender has none [attribute.unknown]",
                    "5:12: " + error("appender.A.append=true") +
                        "; lines are always appended, and written at once [attribute.unknown]",
                    "6:12: " + error("appender.A.datePattern=x") +
                        "; files are rotated by size, not by date [attribute.unknown]",
                    "7:23: " + error("appender.rootAppender.target=System.err") +
                        "; an appender without fileName writes to standard error "
                        "[attribute.unknown]"));
}

TEST_F(LogcheckKeysTest, AWordThatIsNeitherALevelNorAnAppenderIsOneMessage) {
    EXPECT_THAT(
        findings("rootCategory=INFO, MIAN\nappender.MAIN.fileName=/a.log\n"
                 "category.x=NOBODY, MAIN\ncategory.y=\"MAIN\", stderr\n"),
        ElementsAre("1:20: error: Parse error at \"INFO, MIAN\": \"MIAN\" is neither a level nor "
                    "an appender; the root names no appender that exists, so it writes to "
                    "rootAppender; did you mean \"MAIN\"? [word.unknown]",
                    "3:12: error: Parse error at \"x=NOBODY, MAIN\": \"NOBODY\" is neither a "
                    "level nor an appender [word.unknown]",
                    "4:12: error: Parse error at \"y=\"MAIN\", stderr\": \"\"MAIN\"\" is neither "
                    "a level nor an appender; quotation marks are part of the word; the category "
                    "names no appender that exists, so it writes to rootAppender; did you mean "
                    "\"MAIN\"? [word.unknown]",
                    "4:20: error: Parse error at \"y=\"MAIN\", stderr\": \"stderr\" is neither a "
                    "level nor an appender; the category names no appender that exists, so it "
                    "writes to rootAppender; did you mean \"rootAppender\"? [word.unknown]"));
}

TEST_F(LogcheckKeysTest, AnAppenderThatOnlyARefusedLineNamesIsNotCalledUnused) {
    const std::string appender = "appender.A.fileName=/a\n";
    EXPECT_THAT(codes("rootLogger=INFO, A\n" + appender), ElementsAre("key.other-name"));
    EXPECT_THAT(codes("rootCategory=INFO, A#\n" + appender), ElementsAre("word.hash"));
    EXPECT_THAT(codes("rootCategory=INFO, a\n" + appender), ElementsAre("word.unknown"));
    EXPECT_THAT(codes("rootLogger=INFO, B\n" + appender),
                ElementsAre("key.other-name", "appender.unused"));
    EXPECT_THAT(codes("rootCategory=INFO\nappender.B.x=A\n" + appender),
                ElementsAre("attribute.unknown", "appender.unused"));
}

TEST_F(LogcheckKeysTest, LevelsInTheWrongCaseAndOfOtherNames) {
    EXPECT_THAT(
        findings(good + "category.x=Warn, A\ncategory.y=WARNING\n"),
        ElementsAre(
            "3:12: error: Parse error at \"x=Warn, A\": \"Warn\" is neither a level nor "
            "an appender; levels are in upper case; did you mean \"WARN\"? [level.case]",
            "4:12: error: Parse error at \"y=WARNING\": \"WARNING\" is neither a level "
            "nor an appender; that is a level name of other libraries; did you mean \"WARN\"? "
            "[level.other-name]"));
    EXPECT_EQ(fixed("rootCategory=debug\ncategory.a = Warning\ncategory.b=trace\ncategory.c=err\n"
                    "category.d=CRITICAL\ncategory.e=off\ncategory.f='notice'\n"),
              "rootCategory=DEBUG\ncategory.a = WARN\ncategory.b=DEBUG\ncategory.c=ERROR\n"
              "category.d=CRIT\ncategory.e=EMERG\ncategory.f=NOTICE\n");
    EXPECT_EQ(fixed("rootCategory=none\ncategory.a=FINEST\ncategory.b=A, debug\n"),
              "rootCategory=EMERG\ncategory.a=DEBUG\ncategory.b=A, DEBUG\n");
    // Behind a level it is surely no other one: an appender that was forgotten.
    EXPECT_THAT(codes("rootCategory=INFO, trace\ncategory.x=INFO, debug\n"),
                ElementsAre("word.unknown", "word.unknown"));
    EXPECT_EQ(fixed("rootCategory=INFO, trace\ncategory.x=INFO, debug\n"),
              "rootCategory=INFO, trace\ncategory.x=INFO, debug\n");
    EXPECT_THAT(findings("rootCategory=INFO, trace\nappender.trace.fileName=/trace\n"), IsEmpty());
}

TEST_F(LogcheckKeysTest, AHashDirectlyBehindAWord) {
    EXPECT_THAT(findings(good + "category.x=WARN, A# main\n"),
                ElementsAre("3:18: error: Parse error at \"x=WARN, A#\": \"A#\" is neither a "
                            "level nor an appender; a \"#\" right after a word is part of it; "
                            "the category names no appender that exists, so it writes to A; did "
                            "you mean \"A\"? [word.hash]"));
    EXPECT_EQ(fixed(good + "category.x=WARN, A# main\n"), good + "category.x=WARN, A # main\n");
}

TEST_F(LogcheckKeysTest, EmergSilences) {
    EXPECT_THAT(findings("rootCategory=EMERG\ncategory.x=EMERG\n"),
                ElementsAre("1:14: warning: nothing is logged at EMERG: the root, and each "
                            "channel without a level of its own, is silent, FATAL messages "
                            "included [level.silent]",
                            "2:12: warning: nothing is logged at EMERG: category \"x\" is silent, "
                            "FATAL messages included [level.silent]"));
    EXPECT_THAT(findings("rootCategory=FATAL\n"), IsEmpty());
    // Of several levels the last one counts.
    EXPECT_THAT(codes("category.x=EMERG, DEBUG\n"), ElementsAre("category.levels"));
    EXPECT_THAT(codes("category.x=EMERG\ncategory.x=DEBUG\n"), ElementsAre("category.repeated"));
    EXPECT_THAT(codes("category.x=DEBUG\ncategory.x=EMERG\n"),
                ElementsAre("category.repeated", "level.silent"));
    EXPECT_THAT(codes("rootCategory=EMERG\nrootCategory=rootAppender\n"),
                ElementsAre("category.replaced"));
}

TEST_F(LogcheckKeysTest, ALevelThatNoMethodLogsAtIsANote) {
    EXPECT_THAT(findings("category.x=NOTICE\ncategory.y=ALERT\n"),
                ElementsAre("1:12: note: nothing is logged at NOTICE: it lets pass what WARN "
                            "does; did you mean \"WARN\"? [level.unused]",
                            "2:12: note: nothing is logged at ALERT: it lets pass what FATAL "
                            "does; did you mean \"FATAL\"? [level.unused]"));
}

TEST_F(LogcheckKeysTest, CategoriesThatNoLoggerIsCalled) {
    EXPECT_THAT(
        findings("category.root=INFO\ncategory.net.*=INFO\ncategory.*=INFO\ncategory.a.=INFO\n"
                 "category.Debug=INFO\ncategory. v=INFO\ncategory.=INFO\n"),
        ElementsAre(
            "1:10: warning: category \"root\" is one like any other; what all others inherit from "
            "is set by rootCategory; did you mean \"rootCategory\"? [category.root]",
            "2:10: warning: category \"net.*\" is a logger of just that name: there are no "
            "wildcards, and names are flat; did you mean \"net\"? [category.wildcard]",
            "3:10: warning: category \"*\" is a logger of just that name: there are no wildcards, "
            "and names are flat; did you mean \"rootCategory\"? [category.wildcard]",
            "4:10: warning: category \"a.\" is a logger of just that name: there are no wildcards, "
            "and names are flat; did you mean \"a\"? [category.wildcard]",
            "5:10: warning: category \"Debug\" is spelt like a level; the root's level is set by "
            "rootCategory [category.level-name]",
            "6:10: warning: category \" v\" has a blank, a comma or a quotation mark in its name, "
            "as no logger is called [category.blank]",
            "7:10: warning: category \"\" has an empty name, as no logger is called "
            "[category.blank]"));
    EXPECT_THAT(
        findings("category.\"x\"=INFO\ncategory.y,z=INFO\ncategory..w=INFO\ncategory.v?=INFO\n"),
        ElementsAre(
            "1:10: warning: category \"\"x\"\" has a blank, a comma or a quotation mark in its "
            "name, as no logger is called; did you mean \"x\"? [category.blank]",
            "2:10: warning: category \"y,z\" has a blank, a comma or a quotation mark in its name, "
            "as no logger is called [category.blank]",
            "3:10: warning: category \".w\" is a logger of just that name: there are no wildcards, "
            "and names are flat; did you mean \"w\"? [category.wildcard]",
            "4:10: warning: category \"v?\" is a logger of just that name: there are no wildcards, "
            "and names are flat; did you mean \"v\"? [category.wildcard]"));
}

TEST_F(LogcheckKeysTest, CategoriesThatDifferInCaseOnly) {
    EXPECT_THAT(findings("category.net=INFO\ncategory.Net=DEBUG\ncategory.network=INFO\n"),
                ElementsAre("2:10: warning: category \"Net\" and category \"net\", line 1, differ "
                            "in case only and are two; did you mean \"net\"? [category.case]"));
}

TEST_F(LogcheckKeysTest, AnAppenderThatIsDeclaredTwice) {
    EXPECT_THAT(findings(good + "appender.A=FileAppender\nappender.A = RollingFileAppender\n"),
                ElementsAre("4:1: warning: Appender \"A\" has been declared before, on line 3: it "
                            "is one appender, with what both say of it [appender.twice]"));
    EXPECT_THAT(findings(good + "appender.A=FileAppender\n"), IsEmpty());
}

TEST_F(LogcheckKeysTest, AttributesOfACategory) {
    EXPECT_THAT(
        findings("category.net.level=DEBUG\ncategory.level=DEBUG\n"),
        ElementsAre("1:10: warning: category \"net.level\" is a logger of just that name: a "
                    "category has no attributes, its value gives its level and its "
                    "appenders; did you mean \"net\"? [category.attribute]"));
    EXPECT_THAT(findings("category.net.additivity=false\n"),
                ElementsAre("1:25: error: Parse error at \"net.additivity=false\": there is no "
                            "additivity: names are flat, and a category that names an appender "
                            "writes to no other [key.additivity]"));
}

// The keys of a later version of another library, of which each says one thing.
TEST_F(LogcheckKeysTest, LoggersWithAttributes) {
    const std::string text =
        "rootLogger.level=info\nlogger.net.level = debug\nlogger.net.name=net\n"
        "logger.net.additivity=false\nlogger.net.appenderRef.a.ref=A\nrootLogger.x=A\n";
    EXPECT_THAT(codes(text), ElementsAre("key.other-name", "key.other-name", "key.unknown",
                                         "key.unknown", "key.unknown", "key.unknown"));
    EXPECT_EQ(fixed(text),
              "rootCategory=INFO\ncategory.net = DEBUG\nlogger.net.name=net\n"
              "logger.net.additivity=false\nlogger.net.appenderRef.a.ref=A\nrootLogger.x=A\n");
}

TEST_F(LogcheckKeysTest, ALineThatIsToGoOnInTheNext) {
    EXPECT_THAT(
        findings("rootCategory=INFO, \\\n    A\nappender.A.fileName=/a\n"),
        ElementsAre(
            "1:20: error: Parse error at \"INFO, \\\": \"\\\" is neither a level nor "
            "an appender; a line cannot be continued on the next one; the root names no appender "
            "that exists, so it writes to rootAppender [word.unknown]",
            "2:5: error: Parse error at \"A\": a backslash does not carry a line on "
            "to the next one [key.unknown]"));
}

TEST_F(LogcheckKeysTest, WordsBetweenOtherSignsThanCommas) {
    const std::string appender = "appender.A.fileName=/a\n";
    for (const std::string value : {"INFO|A", "INFO;A", "A;", "INFO+A"})
        EXPECT_THAT(codes("rootCategory=" + value + '\n' + appender), ElementsAre("word.unknown"));
}

TEST_F(LogcheckKeysTest, ABlankThatIsNone) {
    EXPECT_THAT(findings("rootCategory=INFO,\xC2\xA0"
                         "A\nappender.A.fileName=/a\n"),
                ElementsAre("1:19: error: Parse error at \"INFO,\\xc2\\xa0A\": \"\\xc2\\xa0A\" is "
                            "neither a level nor an appender; the root names no appender that "
                            "exists, so it writes to rootAppender; did you mean \"A\"? "
                            "[word.unknown]"));
}

// What follows from a refused line is not told besides.
TEST_F(LogcheckKeysTest, OneSlipIsOneMessage) {
    const std::string root = "rootCategory=INFO,A\n";
    EXPECT_THAT(codes(root + "appender.A.filename=/a\n"), ElementsAre("key.case"));
    EXPECT_THAT(codes(root + "appender.A.fileNmae=/a\n"), ElementsAre("attribute.unknown"));
    EXPECT_THAT(codes(root + "appender.A.fileName:/a\nappender.A.layout=BasicLayout\n"),
                ElementsAre("key.colon"));
    EXPECT_THAT(codes(root + "log4j.appender.A.fileName=/a\nappender.A.layout=BasicLayout\n"),
                ElementsAre("key.prefix"));
    EXPECT_THAT(codes(root + "apender.A.fileName=/a\nappender.A.maxFileSize=4096\n"
                             "appender.A.maxBackupIndex=1\n"),
                ElementsAre("key.unknown"));
    EXPECT_THAT(codes(root + "appender.A.fileName/a\nappender.A.maxFileSize=4096\n"
                             "appender.A.maxBackupIndex=1\n"),
                ElementsAre("key.unknown"));
    EXPECT_THAT(codes(good + "appender..A.fileName=/a\n"), ElementsAre("attribute.unknown"));
    EXPECT_THAT(codes(root + "appender.A.File=/a\nappender.A.maxFileSize=4096\n"
                             "appender.A.maxBackupIndex=1\n"),
                ElementsAre("key.other-name"));
    EXPECT_THAT(codes(good + "appender.A.maxFileSize=10MB\nappender.A.maxBackupIndex=1\n"),
                ElementsAre("number.unit"));
    EXPECT_THAT(codes(good + "appender.A.MaxFileSize=4096\nappender.A.maxBackupIndex=1\n"),
                ElementsAre("key.case"));
    EXPECT_THAT(codes(good + "appender.A.maxFileSize=4096\nappender.A.maxBackups=1\n"),
                ElementsAre("key.other-name"));
    EXPECT_THAT(codes(good + "appender.A.layout=PatternLayout\nappender.A.pattern=%m%n\n"),
                ElementsAre("key.other-name"));
}

TEST_F(LogcheckKeysTest, AnAppenderThatIsMisspelt) {
    EXPECT_THAT(
        findings("rootCategory=INFO,MAIN\nappender.MAIN.fileName=/a\n"
                 "appender.MIAN.maxFileSize=4096\nappender.main.maxBackupIndex=1\n"
                 "appender.MAINS.fileName=/b\n"),
        ElementsAre("3:1: warning: Appender \"MIAN\" is used by nobody; did you mean "
                    "\"MAIN\"? [appender.unused]",
                    "4:1: warning: Appender \"main\" is used by nobody; did you mean "
                    "\"MAIN\"? [appender.unused]",
                    "5:1: warning: Appender \"MAINS\" is used by nobody [appender.unused]"));
    EXPECT_THAT(findings("rootCategory=INFO,MAIN\nappender.MIAN.fileName=/a\n"
                         "appender.MAIN.maxFileSize=4096\nappender.MAIN.maxBackupIndex=1\n"),
                ElementsAre("2:1: warning: Appender \"MIAN\" is used by nobody; did you mean "
                            "\"MAIN\"? [appender.unused]"));
    EXPECT_THAT(findings("rootCategory=INFO,MAIN\nappender.MAINfileName=/a\n"
                         "appender.MAIN.layout=SimpleLayout\n"),
                ElementsAre("2:1: warning: Appender \"MAINfileName\" is used by nobody; did you "
                            "mean \"MAIN\"? [appender.unused]"));
}

TEST_F(LogcheckKeysTest, AConfigurationThatOnlyWritesToStandardErrorCanBeClean) {
    EXPECT_THAT(findings("rootCategory=INFO, rootAppender\ncategory.x=DEBUG, rootAppender\n"
                         "appender.rootAppender.layout=SimpleLayout\n"),
                IsEmpty());
    const auto notes = findings(
        "rootCategory=INFO, CONSOLE\nappender.CONSOLE=ConsoleAppender\n"
        "appender.CONSOLE.layout=SimpleLayout\n");
    EXPECT_THAT(notes, ElementsAre("2:1: note: Appender \"CONSOLE\" has no filename, assuming "
                                   "stderr; rootAppender is there without a word at each start "
                                   "[appender.stderr]"));
    EXPECT_THAT(run({file}).out, HasSubstr("\nno errors, no warnings, 1 note\n"));
}

TEST_F(LogcheckKeysTest, AnAppenderThatWasMeantForAFile) {
    EXPECT_THAT(findings("rootCategory=INFO, A\nappender.A=org.apache.log4j.FileAppender\n"),
                ElementsAre("2:1: warning: Appender \"A\" has no filename, assuming stderr "
                            "[appender.no-file]"));
}

}  // namespace
