#include <gmock/gmock.h>
#include <korvex/util/Logger.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;
using testsupport::execLogcheck;
using testsupport::LogcheckToolTest;
using testsupport::outputLines;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::writeFile;

using LogcheckFindingsTest = LogcheckToolTest;

TEST_F(LogcheckFindingsTest, AnAppenderThatNobodyUses) {
    EXPECT_THAT(findings(good + "\nappender.B.fileName=/b.log\n"),
                ElementsAre("4:1: warning: Appender \"B\" is used by nobody [appender.unused]"));
    EXPECT_THAT(findings(good + "category.x=B\nappender.B.fileName=/b.log\n"), IsEmpty());
}

TEST_F(LogcheckFindingsTest, AnAppenderThatIsSpeltLikeALevel) {
    EXPECT_THAT(findings(good + "appender.WARN.fileName=/w\n"),
                ElementsAre("3:1: warning: Appender \"WARN\" is spelt like a level: no category "
                            "can name it [appender.level-name]"));
}

TEST_F(LogcheckFindingsTest, WordsOfACategoryThatCannotAllBeMeant) {
    EXPECT_THAT(
        findings(good + "category.x=A, A\ncategory.y=DEBUG, INFO\ncategory.z= ,\n"
                        "category.y=WARN\n"),
        ElementsAre("3:1: warning: category \"x\" names \"A\" twice and writes each line twice "
                    "there [category.twice]",
                    "4:1: warning: category \"y\" names several levels; the last one counts "
                    "[category.levels]",
                    "5:1: warning: category \"z\" is given no level and no appender: the line "
                    "says nothing [category.empty]",
                    "6:1: warning: category \"y\" has been set before, on line 4; this line is "
                    "applied on top [category.repeated]"));
}

TEST_F(LogcheckFindingsTest, ARootThatIsReplaced) {
    EXPECT_THAT(findings(" rootCategory=NONE\n" + good),
                ElementsAre("1:2: warning: the root category of this line is replaced by line 2 "
                            "[category.replaced]"));
}

TEST_F(LogcheckFindingsTest, AttributesThatUndoEachOther) {
    EXPECT_THAT(findings("rootCategory=A,B\n"
                         "appender.A.fileName=/a\n"
                         "appender.A.fileName=/b\n"
                         "appender.A.layout.ConversionPattern=%m%n\n"
                         "appender.A.layout=BasicLayout\n"
                         "appender.B.fileName=/c\n"
                         "appender.B.layout=PatternLayout\n"),
                ElementsAre("2:12: warning: fileName of \"A\" is set again on line 3 "
                            "[attribute.repeated]",
                            "4:12: warning: layout.ConversionPattern of \"A\" is overruled by "
                            "line 5 [layout.overruled]",
                            "7:12: warning: PatternLayout of \"B\" comes without "
                            "layout.ConversionPattern: the layout is \"%m%n\" "
                            "[layout.no-pattern]"));
    EXPECT_THAT(findings(good + "appender.A.layout=PatternLayout\n"
                                "appender.A.layout.ConversionPattern=%c %m%n\n"),
                IsEmpty());
}

TEST_F(LogcheckFindingsTest, TheRootAppenderStaysWhereItIs) {
    EXPECT_THAT(findings("appender.rootAppender.fileName=/a\n"
                         "appender.rootAppender.maxFileSize=5\n"
                         "appender.rootAppender.layout=SimpleLayout\n"),
                ElementsAre("1:23: warning: fileName of \"rootAppender\" has no effect: it stays "
                            "on standard error [appender.root]",
                            "2:23: warning: maxFileSize of \"rootAppender\" has no effect: it "
                            "stays on standard error [appender.root]"));
}

// A time zone whose name is empty: strftime's %Z yields nothing.
TEST_F(LogcheckFindingsTest, ALayoutThatFails) {
    std::string zone = "TZif" + std::string(16, '\0');
    for (const char count : {'\0', '\0', '\0', '\0', '\1', '\1'})
        zone += std::string(3, '\0') + count;
    zone += std::string(6 + 1, '\0');
    writeFile(dir.file("zone"), zone);
    configure(pattern + "%d{%Z} %m%n\n");
    const auto result = runInChild([&] {
        setenv("TZ", (':' + dir.file("zone")).c_str(), 1);
        execLogcheck({"-q", file});
        return 127;
    });
    EXPECT_EQ(result.out, file +
                              ":3:12: warning: the layout of \"A\" fails, so messages go to "
                              "standard error: date layout yields nothing: %Z [pattern.fails]\n");
}

// Configurations that are in use or shown as examples: nothing is told that is not so.
TEST_F(LogcheckFindingsTest, SaneConfigurationsAreClean) {
    const std::string root = KORVEX_SOURCE_DIR;
    const std::string etc = root + "/examples/daemon/home/etc/";
    const std::string samples = root + "/docs/samples/config/";
    for (const std::string& path :
         {etc + "log-cmdline.cfg", etc + "myinstall/log.cfg", etc + "myinstall/log-debug.cfg",
          samples + "full.cfg", samples + "empty.cfg", samples + "flat.cfg",
          samples + "inherit.cfg", samples + "level.cfg", samples + "unwritable.cfg"}) {
        const auto result = run({"--home", "/opt/x", path});
        EXPECT_THAT(result.out, testing::ContainsRegex("\nno errors, no warnings(, 1 note)?\n$"))
            << path;
        EXPECT_EQ(result.status, 0) << path;
    }
}

TEST_F(LogcheckFindingsTest, TheDocumentationHasEachCodeAndNoOther) {
    std::string rows;
    for (const std::string& line : outputLines(readFile(KORVEX_SOURCE_DIR "/docs/findings.md"))) {
        if (line.compare(0, 3, "| `") != 0) continue;
        std::string row = line.substr(3, line.size() - 3 - 2);
        for (std::size_t at = 0; (at = row.find(" | ", at)) != row.npos;)
            row.replace(at, 3, "\t");
        row.erase(row.find('`'), 1);
        rows += row + '\n';
    }
    EXPECT_EQ(rows, run({"--codes"}).out);
}

TEST_F(LogcheckFindingsTest, TheDocumentationShowsWhatIsTold) {
    const std::string samples = KORVEX_SOURCE_DIR "/docs/samples/findings";
    const auto shown = [&](const std::string& option) {
        return runInChild([&] {
                   unsetenv("KORVEX_HOME");
                   std::filesystem::current_path(samples);
                   execLogcheck({option, "slips.cfg"});
                   return 127;
               })
            .out;
    };
    EXPECT_EQ(shown("-q"), readFile(samples + "/slips.out"));
    EXPECT_EQ(shown("--fix"), readFile(samples + "/slips.fixed"));
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
        if (!error) {
            EXPECT_THAT(told, Contains(testing::HasSubstr(": warning: " + line))) << line;
            continue;
        }
        line.erase(0, file.size() + 1);
        const std::size_t colon = line.find(": ");
        EXPECT_THAT(told, Contains(testing::AllOf(
                              StartsWith(line.substr(0, colon + 1)),
                              testing::HasSubstr(": error: " + line.substr(colon + 2)))))
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
