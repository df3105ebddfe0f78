#include <gmock/gmock.h>
#include <korvex/util/Logger.h>

#include <algorithm>
#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;
using testsupport::ChildResult;
using testsupport::LogcheckToolTest;
using testsupport::outputLines;
using testsupport::runInChild;

// A whole appender, used by the root.
const std::string kGood = "rootCategory=INFO,A\nappender.A.fileName=/a.log\n";

class LogcheckFindingsTest : public LogcheckToolTest {
  protected:
    // What is told of the configuration, as "LINE: warning: ...".
    std::vector<std::string> findings(const std::string& text) {
        const ChildResult result = check(text);
        std::vector<std::string> all;
        bool errors = false;
        for (const std::string& line : outputLines(result.out)) {
            if (line.compare(0, file.size() + 1, file + ':') != 0) continue;
            all.push_back(line.substr(file.size() + 1));
            errors = errors || all.back().find(": error: ") != std::string::npos;
        }
        const int expected = errors ? 2 : all.empty() ? 0 : 1;
        EXPECT_EQ(result.status, expected) << result.err;
        return all;
    }
};

TEST_F(LogcheckFindingsTest, EveryParseErrorHasItsReason) {
    const std::string lines =
        ": lines are rootCategory=..., category.NAME=..., appender.NAME=... and "
        "appender.NAME.ATTRIBUTE=...";
    const std::string attributes =
        ": the attributes are fileName, maxFileSize, maxBackupIndex, layout and "
        "layout.ConversionPattern";
    EXPECT_THAT(
        findings(kGood + "rootcategory=INFO\n"
                         "category.x\n"
                         "appender.A.maxFileSize=10k\n"
                         "appender.A.layout=Simple\n"
                         "appender.A.filename=/b\n"
                         "category.y=Warn, A#\n"
                         "category.z=A, B, C\n"
                         "appender.rootAppender.bogus=1\n"),
        ElementsAre("3: error: Parse error at \"rootcategory=INFO\"" + lines,
                    "4: error: Parse error at \"x\"" + lines,
                    "5: error: Parse error at \"appender.A.maxFileSize=10k\": \"10k\" is no plain "
                    "number: digits only, nothing behind them",
                    "6: error: Parse error at \"appender.A.layout=Simple\": the layouts are "
                    "BasicLayout, SimpleLayout and PatternLayout",
                    "7: error: Parse error at \"appender.A.filename=/b\"" + attributes,
                    "8: error: Parse error at \"y=Warn, A#\": \"Warn\", \"A#\" are neither a level "
                    "nor an appender; levels are in upper case; a \"#\" right behind a word "
                    "belongs to it",
                    "8: warning: category \"y\" names no appender that exists: it writes to A",
                    "9: error: Parse error at \"z=A, B, C\": \"B\", \"C\" are neither a level nor "
                    "an appender",
                    "10: error: Parse error at \"appender.rootAppender.bogus=1\"" + attributes));
}

TEST_F(LogcheckFindingsTest, ACommentWithoutAnEndIsAnError) {
    EXPECT_THAT(findings(kGood + "\n<!-- a\nb\n"),
                ElementsAre("4: error: Unterminated XML comment started"));
}

TEST_F(LogcheckFindingsTest, TheRootsErrorIsToldWhereItStands) {
    EXPECT_THAT(findings("\nrootCategory=INFO, NONE\n"),
                ElementsAre("2: error: Parse error at \"INFO, NONE\": \"NONE\" is neither a level "
                            "nor an appender",
                            "2: warning: the root category names no appender that exists: it "
                            "writes to rootAppender"));
}

TEST_F(LogcheckFindingsTest, ACategoryThatNamesAnAppenderBesideAWrongWordIsNoWarningMore) {
    EXPECT_THAT(findings(kGood + "category.x=A, B\n"), ElementsAre(StartsWith("3: error: ")));
}

TEST_F(LogcheckFindingsTest, AnAppenderThatNobodyUses) {
    EXPECT_THAT(findings(kGood + "\nappender.B.fileName=/b.log\n"),
                ElementsAre("4: warning: Appender \"B\" is used by nobody"));
    EXPECT_THAT(findings(kGood + "category.x=B\nappender.B.fileName=/b.log\n"), IsEmpty());
}

TEST_F(LogcheckFindingsTest, LimitsWithoutAFileName) {
    EXPECT_THAT(
        findings("rootCategory=A\nappender.A=x\nappender.A.maxFileSize=5\n"
                 "appender.A.maxBackupIndex=1\n"),
        ElementsAre(
            "2: warning: Appender \"A\" has no filename, assuming stderr",
            "3: warning: Appender \"A\" has maxSize set without specifying a filename, ignoring",
            "4: warning: Appender \"A\" has maxBackupIndex set without specifying a filename, "
            "ignoring"));
}

TEST_F(LogcheckFindingsTest, BackupsWithoutASize) {
    EXPECT_THAT(findings(kGood + "appender.A.maxBackupIndex=1\n"),
                ElementsAre("3: warning: Appender \"A\" has maxBackupIndex set without specifying "
                            "maxSize, ignoring"));
}

TEST_F(LogcheckFindingsTest, AValueThatKeepsWhatIsBehindIt) {
    EXPECT_THAT(
        findings("rootCategory=A,B,C,D \n"
                 "appender.A.fileName=/a.log # here\n"
                 "appender.B.fileName=/b.log# here\n"
                 "appender.C.fileName=/c.log\r\n"
                 "appender.D.fileName=/d.log\n"
                 "appender.D.layout.ConversionPattern=%m%n\t\n"),
        ElementsAre("2: warning: fileName keeps the blank behind it: \"/a.log \"",
                    "3: warning: fileName keeps the \"#\" that follows it directly: \"/b.log#\"",
                    "4: warning: fileName keeps the carriage return of a line that ends as on "
                    "Windows: \"/c.log\\x0d\"",
                    "6: warning: layout.ConversionPattern keeps the blank behind it: "
                    "\"%m%n\\x09\"",
                    "6: warning: the layout of \"D\" does not end in %n: its lines run into each "
                    "other"));
}

TEST_F(LogcheckFindingsTest, ACategoryOrAnAppenderThatIsSpeltLikeALevel) {
    EXPECT_THAT(findings(kGood + "category.Debug=A\nappender.WARN.fileName=/w\n"),
                ElementsAre("3: warning: category \"Debug\" is spelt like a level; the root's "
                            "level is set by rootCategory",
                            "4: warning: Appender \"WARN\" is spelt like a level: no category can "
                            "name it",
                            "4: warning: Appender \"WARN\" is used by nobody"));
}

TEST_F(LogcheckFindingsTest, WordsOfACategoryThatCannotAllBeMeant) {
    EXPECT_THAT(
        findings(kGood + "category.x=A, A\ncategory.y=DEBUG, INFO\ncategory.z=\ncategory. v=INFO\n"
                         "category.y=WARN\n"),
        ElementsAre("3: warning: category \"x\" names \"A\" twice and writes each line twice there",
                    "4: warning: category \"y\" names several levels; the last one counts",
                    "5: warning: category \"z\" is given no level and no appender: the line says "
                    "nothing",
                    "6: warning: category \" v\" has an empty name or a blank in it, as no logger "
                    "is called",
                    "7: warning: category \"y\" has been set before, on line 4; this line is "
                    "applied on top"));
}

TEST_F(LogcheckFindingsTest, ARootThatIsReplaced) {
    EXPECT_THAT(findings("rootCategory=NONE\n" + kGood),
                ElementsAre("1: warning: the root category of this line is replaced by line 2"));
}

TEST_F(LogcheckFindingsTest, FileNamesThatLeadElsewhere) {
    EXPECT_THAT(
        findings("rootCategory=A,B,C,D,E\n"
                 "appender.A.fileName=log/a.log\n"
                 "appender.B.fileName=${HOME}/b.log\n"
                 "appender.C.fileName=${KORVEX_HOME}log/c.log\n"
                 "appender.D.fileName=/d.log\n"
                 "appender.E.fileName=/d.log\n"),
        ElementsAre("2: warning: fileName \"log/a.log\" is relative: the file is where the program "
                    "happens to be started",
                    "3: warning: only ${KORVEX_HOME}, and only in front, is replaced; the rest "
                    "stays as written: \"${HOME}/b.log\"",
                    "4: warning: no \"/\" between ${KORVEX_HOME} and \"log/c.log\"",
                    "6: warning: Appender \"E\" writes to the same file as \"D\"; each rotates it "
                    "by itself"));
}

TEST_F(LogcheckFindingsTest, AttributesThatUndoEachOther) {
    EXPECT_THAT(
        findings("rootCategory=A,B\n"
                 "appender.A.fileName=/a\n"
                 "appender.A.fileName=/b\n"
                 "appender.A.layout.ConversionPattern=%m%n\n"
                 "appender.A.layout=BasicLayout\n"
                 "appender.A.maxFileSize=18446744073709551615\n"
                 "appender.B.fileName=/c\n"
                 "appender.B.layout=PatternLayout\n"),
        ElementsAre("2: warning: fileName of \"A\" is set again on line 3",
                    "4: warning: layout.ConversionPattern of \"A\" is overruled by line 5",
                    "6: warning: maxFileSize 18446744073709551615 is too large: it is no limit",
                    "8: warning: PatternLayout of \"B\" comes without layout.ConversionPattern: "
                    "the layout is \"%m%n\""));
    EXPECT_THAT(findings(kGood + "appender.A.layout=PatternLayout\n"
                                 "appender.A.layout.ConversionPattern=%c %m%n\n"),
                IsEmpty());
}

TEST_F(LogcheckFindingsTest, ALayoutThatMakesNoLines) {
    EXPECT_THAT(findings(kGood + "appender.A.layout.ConversionPattern=%-4000000000m%n\n"
                                 "appender.rootAppender.layout.ConversionPattern=x\n"),
                ElementsAre("3: warning: the layout of \"A\" asks for a width of six digits",
                            "4: warning: the layout of \"rootAppender\" does not end in %n: its "
                            "lines run into each other"));
    EXPECT_THAT(findings(kGood + "appender.A.layout.ConversionPattern=%99999m 123456%n\n"),
                IsEmpty());
}

TEST_F(LogcheckFindingsTest, TheRootAppenderStaysWhereItIs) {
    EXPECT_THAT(findings("appender.rootAppender.fileName=/a\n"
                         "appender.rootAppender.maxFileSize=5\n"
                         "appender.rootAppender.layout=SimpleLayout\n"),
                ElementsAre("1: warning: fileName of \"rootAppender\" has no effect: it stays on "
                            "standard error",
                            "2: warning: maxFileSize of \"rootAppender\" has no effect: it stays "
                            "on standard error"));
}

TEST_F(LogcheckFindingsTest, TheDocumentedConfigurationIsClean) {
    const std::string sample = KORVEX_SOURCE_DIR "/docs/samples/config/full.cfg";
    EXPECT_THAT(run({sample}).out, testing::EndsWith("\nno errors, no warnings\n"));
    EXPECT_EQ(run({sample}).status, 0);
}

// The library, reading the same file in a program, logs nothing that the tool does not tell, and
// the other way round as far as errors go.
TEST_F(LogcheckFindingsTest, ItTellsWhatTheLibraryLogs) {
    const std::string text = "rootCategory=INFO, X\n appender.B\nappender.A.maxBackupIndex=2\n" +
                             ("appender.C.fileName=" + dir.file("c.log")) +
                             "\nappender.C.maxBackupIndex=3\ncategory=\ncategory.p=Q\n"
                             "appender.A.maxFileSize=7 \n log4cpp.x\nappender. =\n"
                             "<!-- a\n--> bad\n<!-- end";
    const std::vector<std::string> told = findings(text);
    const std::vector<std::string> logged = outputLines(runInChild([&] {
                                                            Logger::initialize(Pathname(file), {});
                                                            return 0;
                                                        }).err);
    EXPECT_EQ(logged.size(), 12U);
    for (std::string line : logged) {
        const bool error = line.compare(0, file.size() + 1, file + ':') == 0;
        if (error)
            line.replace(line.find(": ", file.size()), 2, ": error: ").erase(0, file.size() + 1);
        EXPECT_THAT(told, Contains(error ? testing::Matcher<std::string>(StartsWith(line))
                                         : testing::HasSubstr(": warning: " + line)))
            << line;
    }
    const auto errors = [](const std::string& line) {
        return line.find(": error: ") != std::string::npos;
    };
    const auto byLibrary = [](const std::string& line) {
        return line.compare(0, 8, "Appender") != 0;
    };
    EXPECT_EQ(std::count_if(told.begin(), told.end(), errors),
              std::count_if(logged.begin(), logged.end(), byLibrary));
}

}  // namespace
