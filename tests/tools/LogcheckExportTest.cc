#include <gmock/gmock.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testsupport::ChildResult;
using testsupport::execLogcheck;
using testsupport::outputLines;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::writeFile;

class LogcheckExportTest : public testsupport::LogcheckToolTest {
  protected:
    ChildResult exported(const std::string& engine, const std::string& text) const {
        return check(text, {"--export", engine});
    }
    static std::string withLayout(const std::string& layout) {
        return "rootCategory=INFO,A\nappender.A.fileName=/var/log/a.log\n"
               "appender.A.layout.ConversionPattern=" +
               layout + "\n";
    }
    // What is said of a layout that is refused; empty: it is not.
    std::string doubt(const std::string& layout, const std::string& engine = "pcre") const {
        const ChildResult result = exported(engine, withLayout(layout));
        EXPECT_EQ(result.out.empty(), result.status != 0) << layout;
        EXPECT_EQ(result.status == 0 ? 0 : 2, result.status);
        return result.err;
    }
    void expectDoubt(const std::string& layout, const std::string& why,
                     const std::string& instead = "%d{ISO8601} %-5p %c: %m%n") const {
        EXPECT_EQ(doubt(layout), "korvex-logcheck: appender \"A\": lines of the layout \"" +
                                     layout + "\" cannot be taken apart without doubt: " + why +
                                     "; this layout would do: " + instead + "\n");
        EXPECT_EQ(doubt(instead), "");
    }
};

TEST_F(LogcheckExportTest, TheEnginesAreListedWithoutAFile) {
    const ChildResult result = run({"--export", "list"});
    EXPECT_EQ(result.status, 0);
    std::vector<std::string> names;
    for (const std::string& line : outputLines(result.out))
        names.push_back(line.substr(0, line.find(' ')));
    EXPECT_THAT(names, testing::ElementsAre("lnav", "rsyslog", "syslog-ng", "fluent-bit", "vector",
                                            "loki", "logstash", "pcre"));
}

// What each engine is told of two files is as it was when people last looked at it. With UPDATE=1
// in the environment it is written anew.
TEST_F(LogcheckExportTest, EachEngineIsToldWhatItWasToldBefore) {
    writeFile(file, readFile(KORVEX_SOURCE_DIR "/examples/daemon/home/etc/myinstall/log.cfg"));
    for (const std::string engine :
         {"lnav", "rsyslog", "syslog-ng", "fluent-bit", "vector", "loki", "logstash", "pcre"}) {
        const ChildResult result = runInChild([&] {
            if (chdir(dir.path().c_str()) != 0) return 126;
            execLogcheck({"--export", engine, "log.cfg", "--home", "/opt/tallyd"});
            return 127;
        });
        EXPECT_EQ(result.status, 0) << result.err;
        const std::string golden = KORVEX_SOURCE_DIR "/tests/engines/golden/" + engine;
        if (std::getenv("UPDATE") != nullptr) writeFile(golden, result.out);
        EXPECT_EQ(result.out, readFile(golden)) << engine;
    }
}

TEST_F(LogcheckExportTest, WithoutACompleteTimeLinesAreInDoubt) {
    expectDoubt("%m%n", "its lines have no time stamp");
    expectDoubt("%-8p: %m%n", "its lines have no time stamp");
    expectDoubt("%R %p %c %m%n", "its lines have no time stamp", "%d{ISO8601} %R %-5p %c: %m%n");
    expectDoubt("%d{ABSOLUTE} %m%n", "its lines have no year");
    expectDoubt("%d{%a %d %B, week %H} %m%n", "its lines have no year");
    expectDoubt("%d{%Y %H:%M:%S} %m%n", "its lines have no day");
    expectDoubt("%.10d %m%n", "its lines have no time of day");
    expectDoubt("%d{%Y-%m-%d %I:%M:%S} %m%n", "its lines have no time of day");
    expectDoubt("%d{date} %m%n", "its lines have no time stamp");
    EXPECT_EQ(doubt("%d{%Y-%m-%d %I:%M:%S %p} %m%n"), "");
    EXPECT_EQ(doubt("%d{ABSOLUTE} %d{%F} %m%n"), "");
    EXPECT_EQ(doubt("%d{%s} %m%n"), "");
}

TEST_F(LogcheckExportTest, ADateThatCannotBeReadBackIsInDoubt) {
    expectDoubt("%d{%y-%m-%d %T} %m%n", "%y in its date leaves the century open");
    expectDoubt("%d{%F %T %Z} %m%n",
                "%Z in its date does not say which time zone is meant; %z does");
    expectDoubt("%d{%F %T %j} %m%n", "its date has a conversion that is not known here: %j");
    expectDoubt("%d{%F %T%n} %m%n", "its date has a newline in it");
    expectDoubt("%.9d %m%n", "a width cuts its date within a number or a word");
    expectDoubt("%40d{%d %B %Y %T} %m%n", "a date of no fixed length is cut or padded");
}

TEST_F(LogcheckExportTest, TextsSideBySideAreInDoubt) {
    const std::string thread = "%d{ISO8601} [%t] %-5p %c: %m%n";
    expectDoubt("%d %c%m%n", "nothing stands between the channel and the message");
    expectDoubt("%d %t%c: %m%n", "nothing stands between the thread and the channel", thread);
    expectDoubt(
        "%d %t %c %m%n",
        "only a blank ends the thread's name, and names such as \"Main Thread\" have blanks",
        thread);
    expectDoubt("%d %R%m%n", "nothing ends the number in front of the message",
                "%d{ISO8601} %R %-5p %c: %m%n");
    expectDoubt("%d %r1 %m%n", "nothing ends the number in front of the text",
                "%d{ISO8601} %r %-5p %c: %m%n");
    EXPECT_EQ(doubt("%d%p%m%n"), "");
}

TEST_F(LogcheckExportTest, WhatFillsUpToTextIsInDoubt) {
    expectDoubt("%d %-20c %m%n", "the blanks that fill up the channel run into the message");
    expectDoubt("%d %020c: %m%n", "zeros in front of the channel may be its own");
    expectDoubt("%d %10m%n", "what pads the message may be its own");
    expectDoubt("%d %.1p %m%n", "it cuts ERROR and EMERG to the same letters");
    expectDoubt("%d %.3r %m%n", "it cuts a number", "%d{ISO8601} %r %-5p %c: %m%n");
    EXPECT_EQ(doubt("%d %-5p %m%n"), "");
    EXPECT_EQ(doubt("%d %-20c: %m%n"), "");
}

TEST_F(LogcheckExportTest, TheMessageIsTheEndOfTheLine) {
    expectDoubt("%d %p%n", "it does not print the message (%m)");
    expectDoubt("%d %.0m%n", "it does not print the message (%m)");
    expectDoubt("%d %m", "its lines do not end (%n)");
    expectDoubt("%d %m [%c]%n",
                "the message may be of any text, so nothing but %n can come after it");
    expectDoubt("%d%n%m%n", "a newline stands in front of the message");
    EXPECT_EQ(doubt("%d %.100m%n"), "");
}

// The layouts of the documentation's table: all but two have no time.
TEST_F(LogcheckExportTest, TheLayoutsOfTheDocumentationAreJudged) {
    std::ifstream table(KORVEX_SOURCE_DIR "/docs/samples/layouts.out");
    unsigned judged = 0;
    for (std::string line; std::getline(table, line);) {
        if (line.rfind("| `", 0) != 0) continue;
        const std::string layout = line.substr(3, line.find("` |") - 3);
        EXPECT_THAT(doubt(layout), HasSubstr("cannot be taken apart without doubt: ")) << layout;
        ++judged;
    }
    EXPECT_GT(judged, 20U);
}

TEST_F(LogcheckExportTest, TheDatesOfTheDocumentationAreJudgedAndTriedWithTheEngines) {
    const std::string tried = readFile(KORVEX_SOURCE_DIR "/tests/engines/layouts.txt");
    std::ifstream table(KORVEX_SOURCE_DIR "/docs/samples/dates.out");
    std::vector<std::string> accepted;
    for (std::string line; std::getline(table, line);) {
        if (line.rfind("| `", 0) != 0) continue;
        const std::string date = line.substr(3, line.find("` |") - 3);
        if (!doubt(date + " %-5p [%t] %c: %m%n").empty()) continue;
        accepted.push_back(date);
        EXPECT_THAT(tried, HasSubstr(date + ' '));
    }
    EXPECT_THAT(accepted, testing::ElementsAre("%d", "%d{}", "%d{ISO8601}", "%d{DATE}",
                                               "%d{%Y-%m-%dT%H:%M:%S%z}", "%d{%s.%l}", "%-26dx"));
}

TEST_F(LogcheckExportTest, WhatAnEngineCannotBeToldIsAnErrorOfThatEngine) {
    const std::string noPoint = "%d{%F %T:%l} %m%n";
    EXPECT_EQ(
        doubt(noPoint, "loki"),
        "korvex-logcheck: appender \"A\": loki cannot be told its layout: milliseconds need a "
        "point or a comma in front of them\n");
    EXPECT_EQ(doubt(noPoint, "rsyslog"), "");
    EXPECT_THAT(doubt("%d%p %m%n", "rsyslog"), HasSubstr("rsyslog cannot be told its layout: where "
                                                         "the date ends"));
    EXPECT_EQ(doubt("%d%p %m%n", "lnav"), "");
    EXPECT_THAT(doubt("%d{%s %S %F} %m%n", "logstash"), HasSubstr("%s in a date cannot be told"));
}

TEST_F(LogcheckExportTest, ACategoryWhoseNameLooksLikeItsEndIsRefused) {
    const std::string start = withLayout("%d %c: %m%n");
    EXPECT_THAT(exported("pcre", start + "category.a: b=INFO\n").err,
                EndsWith("appender \"A\": the name of category \"a: b\" has in it what ends it in "
                         "the line\n"));
    EXPECT_EQ(exported("pcre", start + "category.a b=INFO\n").status, 0);
    EXPECT_EQ(exported("pcre", withLayout("%d %c %m%n") + "category.a b=INFO\n").status, 2);
}

TEST_F(LogcheckExportTest, WhatIsNoPlaceOfAFileIsRefused) {
    const auto named = [](const std::string& name) {
        return "rootCategory=INFO,A\nappender.A.fileName=" + name +
               "\nappender.A.layout.ConversionPattern=%d %m%n\n";
    };
    EXPECT_THAT(exported("lnav", named("${KORVEX_HOME}/a")).err, HasSubstr("give --home"));
    EXPECT_THAT(exported("lnav", named("a.log")).err, HasSubstr("its file name is relative"));
    EXPECT_EQ(exported("lnav", "rootCategory=INFO\n").err,
              "korvex-logcheck: no appender writes to a file\n");
    EXPECT_THAT(exported("lnav", named("/a") + "nonsense\n").err,
                HasSubstr("log.cfg has errors; korvex-logcheck shows them without --export\n"));
    EXPECT_THAT(exported("nagios", named("/a")).err, HasSubstr("no engine \"nagios\""));
}

TEST_F(LogcheckExportTest, OneAppenderMayBeExportedAlone) {
    const std::string text = withLayout("%d %m%n") + "appender.B.fileName=/b\n";
    EXPECT_EQ(exported("pcre", text).status, 2);
    const ChildResult alone = check(text, {"--export", "pcre", "--appender", "A"});
    EXPECT_EQ(alone.status, 0);
    EXPECT_THAT(alone.out, HasSubstr("# A: /var/log/a.log\n"));
    EXPECT_THAT(check(text, {"--export", "pcre", "--appender", "C"}).err,
                HasSubstr("no appender \"C\""));
}

TEST_F(LogcheckExportTest, TwoAppendersOfOneFileAreRefusedAndIdsAreUnique) {
    const std::string more =
        withLayout("%d %m%n") + "appender.a.layout.ConversionPattern=%d %m%n\n";
    EXPECT_THAT(exported("pcre", more + "appender.a.fileName=/var/log/a.log\n").err,
                HasSubstr("appender \"a\": another appender writes to its file"));
    const std::string out = exported("loki", more + "appender.a.fileName=/b\n").out;
    EXPECT_THAT(out, HasSubstr("job_name: korvex_a\n"));
    EXPECT_THAT(out, HasSubstr("job_name: korvex_a_2\n"));
}

TEST_F(LogcheckExportTest, QuotesAndPercentSignsInALayoutStayWhole) {
    const std::string text = withLayout("%d '%c' \"%p\" 50%% / %m%n");
    EXPECT_THAT(exported("pcre", text).out, HasSubstr("\\x27(?<channel>[^\\n]+?)\\x27 \\x22"));
    EXPECT_THAT(exported("loki", text).out, HasSubstr("\\x27(?P<channel>[^\\n]+?)\\x27 \\x22"));
    EXPECT_THAT(exported("rsyslog", text).out, HasSubstr(R"(}%\" 50%% / %message:rest%")"));
}

}  // namespace
