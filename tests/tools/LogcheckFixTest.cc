#include <gmock/gmock.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <set>
#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;
using testsupport::ChildResult;
using testsupport::LogcheckToolTest;
using testsupport::outputLines;
using testsupport::readFile;

class LogcheckFixTest : public LogcheckToolTest {
  protected:
    // The codes, by whether --fix mends them: "yes", "no" or "where sure".
    std::set<std::string> codesMended(const std::string& how) const {
        std::set<std::string> all;
        for (const std::string& line : outputLines(run({"--codes"}).out)) {
            const std::size_t name = line.find('\t');
            const std::size_t severity = line.find('\t', name + 1);
            const std::size_t mended = line.find('\t', severity + 1);
            if (line.substr(severity + 1, mended - severity - 1) == how) {
                all.insert(line.substr(0, name));
            }
        }
        return all;
    }
};

const std::string kForeign =
    "# of another library\r\n"
    "log4j.rootLogger=debug, MAIN# everything\r\n"
    "log4j.logger.net: WARNING\r\n"
    "\r\n"
    "log4j.appender.MAIN=org.apache.log4j.RollingFileAppender\r\n"
    "log4j.appender.MAIN.File=$KORVEX_HOME/log/main.log # here\r\n"
    "log4j.appender.MAIN.MaxFileSize=10MB\r\n"
    "log4j.appender.MAIN.MaxBackupIndex=5 # days\r\n"
    "log4j.appender.MAIN.layout=org.apache.log4j.PatternLayout\r\n"
    "log4j.appender.MAIN.layout.ConversionPattern=\"%d{yyyy-MM-dd HH:mm:ss,SSS} %level %c{2} - "
    "%m\\n\"\r\n";

TEST_F(LogcheckFixTest, AConfigurationOfAnotherLibraryBecomesOneOfOurs) {
    const ChildResult result = check(kForeign, {"--fix"});
    EXPECT_EQ(result.out,
              "# of another library\n"
              "log4cpp.rootCategory=DEBUG, MAIN # everything\n"
              "log4cpp.category.net= WARN\n"
              "\n"
              "log4cpp.appender.MAIN=org.apache.log4j.RollingFileAppender\n"
              "# here\n"
              "log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/main.log\n"
              "log4cpp.appender.MAIN.maxFileSize=10485760\n"
              "# days\n"
              "log4cpp.appender.MAIN.maxBackupIndex=5\n"
              "log4cpp.appender.MAIN.layout=PatternLayout\n"
              "log4cpp.appender.MAIN.layout.ConversionPattern=%d{%Y-%m-%d %H:%M:%S,%l} %p %c - "
              "%m%n\n");
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(findings(result.out), IsEmpty());
}

TEST_F(LogcheckFixTest, WhatIsNotMendedIsToldOnStandardErrorAndByTheStatus) {
    const ChildResult result = check("rootCategory=debug, NOBODY\n", {"--fix"});
    EXPECT_EQ(result.out, "rootCategory=DEBUG, NOBODY\n");
    EXPECT_THAT(result.err, StartsWith(file + ":1:21: error: Parse error at \"DEBUG, NOBODY\": "));
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(check("rootCategory=debug, EMERG\n", {"--fix"}).status, 1);
}

TEST_F(LogcheckFixTest, TheFileItselfIsLeftAlone) {
    check("rootCategory=debug\n", {"--fix"});
    EXPECT_EQ(readFile(file), "rootCategory=debug\n");
}

TEST_F(LogcheckFixTest, EveryOtherByteStays) {
    const std::string odd =
        "\t log4cpp.rootCategory \t=  debug ,\t,A   \n\n#\x01\xff\n<!-- x --> \n"
        "appender.A.fileName=/a.log\n \t\nappender.A.layout=SimpleLayout\n#end";
    std::string expected = odd;
    expected.replace(expected.find("debug"), 5, "DEBUG");
    EXPECT_EQ(fixed(odd), expected);
    EXPECT_EQ(fixed(expected), expected);
    EXPECT_EQ(fixed(""), "");
}

TEST_F(LogcheckFixTest, LinesThatACommentInterruptsAreMendedOnlyWhereItDoesNot) {
    EXPECT_EQ(fixed("rootCategory=de<!-- x -->bug, info\n"),
              "rootCategory=de<!-- x -->bug, INFO\n");
    EXPECT_EQ(fixed("<!-- x --> appender.rootAppender.layout=BasicLayout # c\n"),
              "<!-- x --> appender.rootAppender.layout=BasicLayout # c\n");
}

// Every way to spell each part of a configuration, well and badly, against the others in turn.
class GeneratedTest : public LogcheckFixTest {
  protected:
    const std::vector<std::string> prefixes = {"", "log4cpp.", "log4j.", "log4cpp::", "LOG4CPP."};
    const std::vector<std::string> levels = {"INFO", "info", "WARNING", "Trace", "'debug'", "LOUD"};
    const std::vector<std::string> names = {"fileName", "filename", "File", "FILENAME"};
    const std::vector<std::string> files = {"${KORVEX_HOME}/a.log", "$KORVEX_HOME/a.log",
                                            "\"/a.log\"", "a.log"};
    const std::vector<std::string> sizes = {"1048576", "10MB", "1,000", "010", "10 kB", "-1"};
    const std::vector<std::string> layouts = {"PatternLayout", "org.x.PatternLayout", "pattern"};
    const std::vector<std::string> dates = {"%d{ISO8601}",    "%d{iso8601}",  "%date{HH:mm:ss,SSS}",
                                            "%d{yyyy-MM-dd}", "%d{%H:%m.%f}", "%d{h:mm}"};
    const std::vector<std::string> texts = {" %m%n", " %msg%n", " %c{2} %m\\n", " %x %m%n%"};
    const std::vector<std::string> tails = {"", " ", " # comment", "# comment", "\t"};
    const std::vector<std::string> ends = {"\n", "\r\n"};

    std::string configuration(std::uint64_t seed) const {
        const auto pick = [&](const std::vector<std::string>& from) {
            seed = seed * 6364136223846793005ULL + 1442695040888963407ULL;
            return from[static_cast<std::size_t>(seed >> 33U) % from.size()];
        };
        const std::string end = pick(ends);
        const std::string prefix = pick(prefixes);
        const std::string a = prefix + "appender.A.";
        return prefix + pick({"rootCategory", "rootcategory", "rootLogger"}) +
               pick({"=", ":", " = "}) + pick(levels) + ", A" + pick(tails) + end + a +
               pick(names) + '=' + pick(files) + pick(tails) + end + a +
               "maxFileSize=" + pick(sizes) + pick(tails) + end + a + "maxBackupIndex=3" +
               pick(tails) + end + a + "layout=" + pick(layouts) + pick(tails) + end + a +
               "layout.ConversionPattern=" + pick(dates) + pick(texts) + pick(tails) + end;
    }
};

TEST_F(GeneratedTest, WhatIsMendedIsNotFoundAgain) {
    const std::set<std::string> always = codesMended("yes");
    EXPECT_GE(always.size(), 15U);
    std::set<std::string> seen;
    for (std::size_t seed = 0; seed < 50; ++seed) {
        const std::string text = configuration(seed);
        for (const std::string& code : codes(text))
            seen.insert(code);
        const std::string once = fixed(text);
        for (const std::string& code : codes(once))
            EXPECT_EQ(always.count(code), 0U) << code << " in " << once;
        EXPECT_EQ(fixed(once), once);
        EXPECT_EQ(once.find('\r'), once.npos);
        // What is no slip is still there.
        EXPECT_EQ(
            std::count(text.begin(), text.end(), ','),
            std::count(once.begin(), once.end(), ',') + (text.find("=1,000") != text.npos ? 1 : 0));
        for (const std::string kept : {"maxBackupIndex=3", "LOUD", "-1"})
            EXPECT_EQ(once.find(kept) == once.npos, text.find(kept) == text.npos) << once;
        const std::string comment = "# comment";
        std::size_t comments = 0;
        for (std::size_t at = 0; (at = text.find(comment, at)) != text.npos; ++at)
            ++comments;
        for (std::size_t at = 0; (at = once.find(comment, at)) != once.npos; ++at)
            --comments;
        EXPECT_EQ(comments, 0U) << once;
    }
    EXPECT_GE(seen.size(), 20U);
}

// The corpus of the fuzzer has a file for each code, called so.
TEST_F(LogcheckFixTest, EachCodeIsFoundInTheConfigurationThatIsCalledLikeIt) {
    const std::string corpus = KORVEX_SOURCE_DIR "/fuzz/corpus/LogcheckFix/";
    const std::set<std::string> onlyElsewhere = {"path.missing", "path.no-directory", "path.denied",
                                                 "path.no-rotation", "pattern.fails"};
    std::size_t count = 0;
    for (const std::string how : {"yes", "no", "where sure"}) {
        for (const std::string& code : codesMended(how)) {
            ++count;
            if (onlyElsewhere.count(code) > 0) continue;
            EXPECT_THAT(run({"-q", corpus + code}).out, HasSubstr(" [" + code + "]\n"));
            const std::string rest = run({"--fix", corpus + code}).err;
            if (how == "where sure") continue;
            const bool left = rest.find('[' + code + ']') != rest.npos;
            EXPECT_EQ(left, how == "no") << rest;
        }
    }
    EXPECT_GE(count, 70U);
}

TEST_F(LogcheckFixTest, ACleanConfigurationIsCopied) {
    const std::string clean = readFile(KORVEX_SOURCE_DIR "/docs/samples/config/full.cfg");
    const ChildResult result = check(clean, {"--fix"});
    EXPECT_EQ(result.out, clean);
    EXPECT_THAT(outputLines(result.err), ElementsAre(HasSubstr(": note: ")));
    EXPECT_EQ(result.status, 0);
}

TEST_F(LogcheckFixTest, OneFileAtATime) {
    const ChildResult result = run({"--fix", file, file});
    EXPECT_EQ(result.err, "korvex-logcheck: --fix takes one file at a time\n");
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.status, 2);
}

}  // namespace
