#include <gmock/gmock.h>
#include <korvex/util/Logger.h>

#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::LogcheckToolTest;

class LogcheckPatternsTest : public LogcheckToolTest {
  protected:
    // What is told of a pattern; the columns begin with it.
    std::vector<std::string> told(const std::string& text) const {
        std::vector<std::string> all = findings(pattern + text + '\n');
        for (std::string& line : all) {
            const std::size_t colon = line.find(':');
            const std::size_t column = std::stoul(line.substr(colon + 1));
            EXPECT_EQ(line.substr(0, colon), "3");
            line = std::to_string(column - kBefore) + line.substr(line.find(':', colon + 1));
        }
        return all;
    }
    // The pattern that --fix makes of it.
    std::string mended(const std::string& text) const {
        const std::string out = fixed(pattern + text + '\n');
        EXPECT_EQ(out.substr(0, pattern.size()), pattern);
        return out.substr(pattern.size(), out.size() - pattern.size() - 1);
    }

    static constexpr std::size_t kBefore = 36;  // of its line
};

std::string nothing(const std::string& conversion) {
    return "warning: there is no conversion \"" + conversion + "\": it prints nothing";
}

TEST_F(LogcheckPatternsTest, EveryConversionThatThereIsIsClean) {
    EXPECT_THAT(told("%d %d{} %d{DATE} %d{ISO8601} %d{ABSOLUTE} %r %R %u %-5p %05r [%t] %.20c: "
                     "100%% %% %%m %10.3m %.m{} %n"),
                ElementsAre(testing::EndsWith("[pattern.argument]")));
    EXPECT_THAT(told("\033[31m%p\033[0m %m%n"), IsEmpty());
}

TEST_F(LogcheckPatternsTest, ConversionsThatThereAreNot) {
    const std::string place = "; a message does not know its file, line or method";
    const std::string code = " [pattern.unknown]";
    EXPECT_THAT(
        told("%x%F%L%M%l%C{1}%X{u} %m%n"),
        ElementsAre("1: " + nothing("%x") + "; there is no diagnostic context" + code,
                    "3: " + nothing("%F") + place + code, "5: " + nothing("%L") + place + code,
                    "7: " + nothing("%M") + place + code,
                    "9: " + nothing("%l") + place +
                        ", and milliseconds are %l within the braces of %d only" + code,
                    "11: " + nothing("%C{1}") + "; did you mean \"%c\"?" + code,
                    "16: " + nothing("%X{u}") + "; there is no diagnostic context" + code));
    EXPECT_THAT(told("%3%m%m%n"), ElementsAre("1: " + nothing("%3%") + code));
    EXPECT_THAT(told("%- 5p%m%n"), ElementsAre("1: " + nothing("%- ") + code));
    EXPECT_EQ(mended("%-5P %C %x%N %m%n"), "%-5p %C %x%n %m%n");
}

// The library and the tool know the same letters.
TEST_F(LogcheckPatternsTest, TheLettersAreThoseOfTheLibrary) {
    const Logger logger("channel");
    const LogMsgMetadata md(&logger, WARN);
    std::size_t count = 0;
    for (char letter = 'A'; letter <= 'z'; ++letter) {
        if (letter > 'Z' && letter < 'a') continue;
        const std::string conversion = std::string("%") + letter;
        std::string line;
        LogFormat(conversion.c_str()).apply(line, md, "message");
        const std::vector<std::string> all = told(conversion + " %m%n");
        if (line.empty()) {
            ++count;
            EXPECT_THAT(all, ElementsAre(testing::StartsWith("1: " + nothing(conversion))));
        } else {
            EXPECT_THAT(all, IsEmpty()) << conversion;
        }
    }
    EXPECT_EQ(count, 52U - 9U);
}

TEST_F(LogcheckPatternsTest, ADateOutsideOfItsBracesIsToldOnce) {
    const std::string date =
        ": warning: there is no conversion \"%Y\": it prints nothing; what is a date's stands in "
        "%d{...} [pattern.unknown]";
    EXPECT_THAT(told("%Y-%m-%d %H:%M:%S %p: %m%n"), ElementsAre("1" + date));
    EXPECT_THAT(told("d{%Y-%m-%d %H:%M} %m%n"), ElementsAre("3" + date));
    EXPECT_THAT(told("%%d{%Y-%m-%d %H:%M} %m%n"), ElementsAre("5" + date));
    EXPECT_THAT(told("%H %m%n"), ElementsAre("1: " + nothing("%H") + " [pattern.unknown]"));
}

TEST_F(LogcheckPatternsTest, ABlankInAConversion) {
    EXPECT_THAT(told("% m%n"), ElementsAre("1: " + nothing("% ") +
                                           ", and the letter after it is text; did you mean "
                                           "\"%m\"? [pattern.unknown]"));
    EXPECT_EQ(mended("%- p 50% of %m%n"), "%-p 50% of %m%n");
}

TEST_F(LogcheckPatternsTest, AHashCutsThePattern) {
    const std::string hash =
        ": warning: a comment begins at the \"#\", wherever it stands: the pattern ends before it "
        "[pattern.hash]";
    EXPECT_THAT(told("%p # %m%n"), ElementsAre("4" + hash));
    EXPECT_THAT(told("[#%t] %p %m%n"), ElementsAre("2" + hash));
    EXPECT_THAT(told("%m #%t%n"), ElementsAre("4" + hash));
    // A comment behind a pattern that is whole, and one that holds none.
    EXPECT_THAT(told("%m%n   # %m is the message"), ElementsAre(testing::EndsWith("[value.tail]")));
    EXPECT_THAT(told("%m%%n # 100% of it"), ElementsAre(testing::EndsWith("[pattern.no-newline]"),
                                                        testing::EndsWith("[value.tail]")));
    EXPECT_THAT(told("%p <!-- %m%n"), ElementsAre(testing::EndsWith("[comment.open]")));
}

TEST_F(LogcheckPatternsTest, ConversionsSpeltOut) {
    EXPECT_THAT(told("%message %-5level %class%n"),
                ElementsAre("1: warning: %message is %m and the text \"essage\"; did you mean "
                            "\"%m\"? [pattern.word]",
                            "10: warning: %level is nothing and the text \"evel\"; did you mean "
                            "\"%p\"? [pattern.word]",
                            "19: warning: %class is %c and the text \"lass\" [pattern.word]"));
    EXPECT_EQ(mended("%date{HH:mm:ss} [%thread] %-5level %logger{36} - %msg%newline"),
              "%d{%H:%M:%S} [%t] %-5p %c - %m%n");
    EXPECT_EQ(mended("%timestamp %threadName %tid %Level %MSG%n"), "%d %t %t %p %m%n");
    EXPECT_THAT(told("%mdc{u} %marker %uuid %ex %clr(%p) %m%n").size(), 5U);
    EXPECT_THAT(told("%cat %mat %nline %m%n"), IsEmpty());
}

TEST_F(LogcheckPatternsTest, AConversionThatThePatternsEndCuts) {
    const std::string cut = "warning: the pattern ends within \"";
    EXPECT_THAT(told("%m%n%"),
                ElementsAre("5: " + cut + "%\", which prints nothing [pattern.cut]"));
    EXPECT_THAT(told("%m%n%-5"),
                ElementsAre("5: " + cut + "%-5\", which prints nothing [pattern.cut]"));
    EXPECT_THAT(told("%m%n%d{ISO8601"),
                ElementsAre("5: " + cut +
                            "%d{ISO8601\", which prints nothing: there is no \"}\"; did you mean "
                            "\"%d{ISO8601}\"? [pattern.cut]"));
    // The rest of the pattern is in it.
    EXPECT_THAT(told("%p %d{%H:%M %m%n"), ElementsAre(testing::EndsWith("[pattern.cut]")));
    EXPECT_THAT(told("%p %m%"), ElementsAre(testing::EndsWith("[pattern.cut]")));
}

TEST_F(LogcheckPatternsTest, AnArgumentWhereNoneCounts) {
    EXPECT_THAT(told("%-5c{2} %m%n"),
                ElementsAre("5: warning: \"{2}\" has no effect after %c: only %d takes an "
                            "argument; a width, as in %.20c, cuts the text; did you mean "
                            "\"%-5c\"? [pattern.argument]"));
    EXPECT_EQ(mended("%-5c{2} %m{}%n{x}"), "%-5c %m%n");
    EXPECT_THAT(
        told("%d{ISO8601}{UTC} %m%n"),
        ElementsAre("12: warning: \"{UTC}\" is printed as it stands: a conversion takes one "
                    "argument, and dates are those of the local time; did you mean "
                    "\"%d{ISO8601}\"? [pattern.argument]"));
    EXPECT_EQ(mended("%d{ISO8601}{UTC} %m%n"), "%d{ISO8601} %m%n");
    EXPECT_THAT(told("{%d}{%t}{%c} %d{DATE}{%p} %d {x} %m%n"), IsEmpty());
}

TEST_F(LogcheckPatternsTest, APatternWithoutItsMessage) {
    EXPECT_THAT(told("%p %c%n"), ElementsAre("1: warning: without %m no line shows its message "
                                             "[pattern.no-message]"));
    EXPECT_THAT(told("%p %.0m %%m%n"), ElementsAre("1: warning: without %m no line shows its "
                                                   "message [pattern.no-message]"));
    EXPECT_THAT(told("%p %M%n"),
                ElementsAre("4: warning: there is no conversion \"%M\": it prints nothing; did you "
                            "mean \"%m\"? [pattern.unknown]"));
    EXPECT_EQ(mended("%p %M%n"), "%p %m%n");
    EXPECT_THAT(told(""), ElementsAre("1: warning: the pattern is empty: nothing is written "
                                      "[pattern.no-message]"));
}

TEST_F(LogcheckPatternsTest, QuotationMarksAreNotToldAsAMissingNewlineToo) {
    EXPECT_THAT(told("\"%m%n\""),
                ElementsAre("1: warning: the quotation marks are printed with each line; did you "
                            "mean \"%m%n\"? [pattern.quoted]"));
    EXPECT_EQ(mended("\"'%p %m%n'\""), "%p %m%n");
    EXPECT_THAT(told("\"%p\" %m%n"), IsEmpty());
    EXPECT_THAT(told("\"%m%n"),
                ElementsAre("1: warning: the quotation mark is printed with each line; did you "
                            "mean \"%m%n\"? [pattern.quoted]"));
    EXPECT_EQ(mended("%m%n'"), "%m%n");
    EXPECT_EQ(mended("\xE2\x80\x9C%m%n\xE2\x80\x9D"), "%m%n");
    EXPECT_THAT(told("it's %m%n"), IsEmpty());
}

TEST_F(LogcheckPatternsTest, BackslashesOfAProgrammingLanguage) {
    EXPECT_THAT(told("%p\\t%m\\n"),
                ElementsAre("3: warning: \\t is printed as it stands [pattern.backslash]",
                            "7: warning: \\n is printed as it stands; a newline is %n; did you "
                            "mean \"%n\"? [pattern.backslash]"));
    EXPECT_EQ(mended("%p\\t%m%%\\r\\n"), "%p\t%m%%%n");
    EXPECT_THAT(told("C:\\temp\\x %m%n"),
                ElementsAre(testing::StartsWith("3: warning: \\t is printed")));
}

TEST_F(LogcheckPatternsTest, LinesThatDoNotEnd) {
    EXPECT_THAT(findings(pattern + "%m\n"),
                ElementsAre("3:12: warning: the layout of \"A\" does not end in %n: its lines run "
                            "into each other [pattern.no-newline]"));
}

TEST_F(LogcheckPatternsTest, ALayoutThatAsksForTooMuch) {
    EXPECT_THAT(findings(pattern + "%-4000000000m%n\n"),
                ElementsAre("3:12: warning: the layout of \"A\" asks for a width of six digits "
                            "[pattern.width]"));
    EXPECT_THAT(codes(pattern + "%d{%0300000Y} %m%n\n"), ElementsAre("pattern.width"));
    EXPECT_THAT(findings(pattern + "%99999m 123456 100%%123456 %.9999999m%n\n"), IsEmpty());
}

// What is cut pads nothing.
TEST_F(LogcheckPatternsTest, AWideConversionThatIsCut) {
    EXPECT_THAT(told("%m%n%999999"), ElementsAre(testing::EndsWith("[pattern.cut]")));
}

TEST_F(LogcheckPatternsTest, DatesInTheJavaForm) {
    EXPECT_THAT(told("%d{HH:mm:ss,SSS} %d{h:mm a} %m%n"),
                ElementsAre("4: warning: \"HH:mm:ss,SSS\" is printed as it stands: dates are "
                            "written as strftime has them; did you mean \"%H:%M:%S,%l\"? "
                            "[date.java]",
                            "21: warning: \"h:mm a\" is printed as it stands: dates are written "
                            "as strftime has them [date.java]"));
    EXPECT_EQ(mended("%d{yyyy-MM-dd} %m%n"), "%d{%Y-%m-%d} %m%n");
    EXPECT_EQ(mended("%d{yyyy-MM-dd'T'HH:mm:ss.SSSZ} %d{dd MMM yyyy} %d{yyyyMMddTHHmmss} %m%n"),
              "%d{%Y-%m-%dT%H:%M:%S.%l%z} %d{%d %b %Y} %d{%Y%m%dT%H%M%S} %m%n");
    EXPECT_EQ(mended("%d{EEE, d MMMM yy hh:mm:ss a 'o''clock'} %m%n"),
              "%d{%a, %e %B %y %I:%M:%S %p o'clock} %m%n");
    EXPECT_EQ(mended("%d{HH:MM} %m%n"), "%d{%H:%M} %m%n");
    EXPECT_EQ(mended("%d{HH:mm:ss.SSSSSS} %m%n"), "%d{HH:mm:ss.SSSSSS} %m%n");
}

TEST_F(LogcheckPatternsTest, TheJavaFormAmongConversions) {
    EXPECT_THAT(told("%d{%H:%M:%S,SSS} %m%n"),
                ElementsAre("13: warning: \"SSS\" is printed as it stands: dates are written as "
                            "strftime has them; did you mean \"%l\"? [date.java]"));
    EXPECT_EQ(mended("%d{%Y-%m-%d'T'%H:mm:ss} %m%n"), "%d{%Y-%m-%dT%H:%M:%S} %m%n");
    EXPECT_THAT(told("%d{%YYYY-%m-%dd %SSS} %m%n"),
                ElementsAre("4: warning: \"%YYYY\" is %Y and the text \"YYY\"; did you mean "
                            "\"%Y\"? [date.java]",
                            "13: warning: \"%dd\" is %d and the text \"d\"; did you mean \"%d\"? "
                            "[date.java]",
                            "17: warning: \"%SSS\" is %S and the text \"SS\" [date.java]"));
    EXPECT_EQ(mended("%d{%YYYY-%MM-%dd %HH:%m} %m%n"), "%d{%Y-%MM-%d %H:%M} %m%n");
    EXPECT_THAT(told("%d{%Hh%Mm%Ss %ss '%y %A, the %d of %B, o'clock, %j days at %H} %m%n"),
                IsEmpty());
}

TEST_F(LogcheckPatternsTest, NamedLayoutsMisspelt) {
    EXPECT_THAT(told("%d{iso8601} %m%n"),
                ElementsAre("4: warning: \"iso8601\" is no named layout, and is printed as it "
                            "stands; they are ISO8601, DATE and ABSOLUTE; did you mean "
                            "\"ISO8601\"? [date.name]"));
    EXPECT_EQ(mended("%d{date} %d{Absolut} %d{ISO-8601} %d{ISO_8601} %d{ISO8061} %m%n"),
              "%d{DATE} %d{ABSOLUTE} %d{ISO8601} %d{ISO8601} %d{ISO8601} %m%n");
}

TEST_F(LogcheckPatternsTest, ADateWithoutAConversion) {
    EXPECT_THAT(told("%d{today} %m%n"), ElementsAre("4: warning: \"today\" has no conversion: each "
                                                    "line shows it as it stands [date.text]"));
    EXPECT_EQ(mended("%d{today} %m%n"), "%d{today} %m%n");
}

TEST_F(LogcheckPatternsTest, ALetterOfADateWithoutItsPercentSign) {
    const std::string text =
        "\" is no conversion: each line shows it as it stands; did you mean \"%";
    EXPECT_THAT(told("%d{%Y-m-%d %H:M:%S,l %d} %m%n"),
                ElementsAre("7: warning: \"m" + text + "m\"? [date.text]",
                            "15: warning: \"M" + text + "M\"? [date.text]",
                            "20: warning: \"l" + text + "l\"? [date.text]"));
    EXPECT_THAT(told("%d{Y-%m-%d} %d{%H:%M:S} %m%n").size(), 2U);
}

TEST_F(LogcheckPatternsTest, ConversionsThatStrftimeDoesNotKnow) {
    EXPECT_THAT(told("%d{%H:%i.%f} %d{%H%} %d{%-E%l} %m%n"),
                ElementsAre("7: warning: strftime knows no \"%i\" [date.unknown]",
                            "10: warning: strftime knows no \"%f\"; the milliseconds are %l; did "
                            "you mean \"%l\"? [date.unknown]",
                            "19: warning: \"%\" is cut short, and printed as it stands "
                            "[date.unknown]",
                            "25: warning: \"%-E\" is cut short, and printed as it stands "
                            "[date.unknown]"));
    EXPECT_EQ(mended("%d{%H:%M:%S.%f} %d{%S,%3N} %d{%S.%Q} %m%n"),
              "%d{%H:%M:%S.%l} %d{%S,%l} %d{%S.%l} %m%n");
    EXPECT_THAT(told("%d{%a%A%b%B%c%C%d%D%e%F%g%G%h%H%I%j%k%m%n%M%p%P%r%R%s%S%t%T%u%U%V%w%W%x%X"
                     "%y%Y%z%Z%%%-d%_5H%^a%^Z%010Y%+4Y%Ey%Od%l} %m%n"),
                IsEmpty());
}

TEST_F(LogcheckPatternsTest, MonthsWhereMinutesAreMeant) {
    EXPECT_THAT(told("%d{%Y-%M-%d %H:%m} %m%n"),
                ElementsAre("4: warning: \"%Y-%M\" shows minutes there; did you mean \"%Y-%m\"? "
                            "[date.minutes]",
                            "13: warning: \"%H:%m\" shows the month there; did you mean "
                            "\"%H:%M\"? [date.minutes]"));
    EXPECT_EQ(mended("%d{%Y-%M-%d %H:%m} %d{%d.%M.%Y} %d{%I:%m} %m%n"),
              "%d{%Y-%m-%d %H:%M} %d{%d.%m.%Y} %d{%I:%M} %m%n");
    EXPECT_EQ(mended("%d{%Y%M%d-%H%m%S} %d{%d-%M-%y %H.%m} %d{%M/%d/%y} %m%n"),
              "%d{%Y%m%d-%H%M%S} %d{%d-%m-%y %H.%M} %d{%m/%d/%y} %m%n");
}

TEST_F(LogcheckPatternsTest, MillisecondsThatAreNone) {
    EXPECT_THAT(told("%d{%S.%3l} %d{%%l} %m%n"),
                ElementsAre("7: warning: \"%3l\" is the hour; only %l, without anything between, "
                            "is the milliseconds [date.milliseconds]",
                            "15: warning: \"%%l\" is a percent sign and the milliseconds: %l is "
                            "looked for first [date.milliseconds]"));
}

TEST_F(LogcheckPatternsTest, ThePatternThatCountsIsTheLast) {
    EXPECT_THAT(codes(pattern + "%x%m%n\nappender.A.layout.ConversionPattern=%m%n\n"),
                ElementsAre("attribute.repeated"));
    EXPECT_THAT(codes("appender.rootAppender.layout.ConversionPattern=%x %m%n\n"),
                ElementsAre("pattern.unknown"));
}

}  // namespace
