#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <gtest/gtest.h>

#include <ctime>
#include <string>

#include "support/Faults.h"

namespace {

using testsupport::Call;
using testsupport::CountCalls;

// The line that a pattern makes of one message.
class LogFormatTest : public testing::Test {
  protected:
    std::string line(const std::string& pattern, const std::string& msg = "message") {
        LogMsgMetadata md(&_logger, _level);
        if (_stampSet) md.stamp = _stamp;
        std::string out;
        LogFormat(pattern.c_str()).apply(out, md, msg);
        return out;
    }
    void setStamp(const Timeval& stamp) {
        _stamp = stamp;
        _stampSet = true;
    }
    void setMsecAfterEpoch(unsigned long long msec) {
        Timeval stamp = epoch_timeval();
        stamp.addMsec(msec);
        setStamp(stamp);
    }

    Logger _logger{"Foo"};
    LogLevel _level = WARN;

  private:
    Timeval _stamp;
    bool _stampSet = false;
};

TEST_F(LogFormatTest, TheDefaultLayoutIsTheMessageAndANewline) {
    EXPECT_EQ(line("%m%n", "abc"), "abc\n");
}

TEST_F(LogFormatTest, TheSimpleLayoutPadsTheLevelToEight) {
    _level = INFO;
    EXPECT_EQ(line("%-8p: %m%n", "abc"), "INFO    : abc\n");
}

TEST_F(LogFormatTest, TheBasicLayoutCountsSecondsSinceTheEpoch) {
    setMsecAfterEpoch(2500);
    EXPECT_EQ(line("%R %p %c %m%n", "x"), "2 WARN Foo x\n");
}

TEST_F(LogFormatTest, TheLineIsAppended) {
    std::string out = "before ";
    LogFormat("%m").apply(out, LogMsgMetadata(&_logger, INFO), "x");
    EXPECT_EQ(out, "before x");
}

TEST_F(LogFormatTest, AMinimumWidthPadsWithBlanksBefore) {
    EXPECT_EQ(line("%5p"), " WARN");
    EXPECT_EQ(line("%4p"), "WARN");
    EXPECT_EQ(line("%3p"), "WARN");
}

TEST_F(LogFormatTest, TheZeroFlagPadsWithZeros) {
    EXPECT_EQ(line("%05p"), "0WARN");
    EXPECT_EQ(line("%010m", "ab"), "00000000ab");
}

TEST_F(LogFormatTest, TheMinusFlagPadsWithBlanksAfter) {
    EXPECT_EQ(line("%-6p|"), "WARN  |");
}

TEST_F(LogFormatTest, OnlyOneFlagIsRead) {
    EXPECT_EQ(line("%-06p|"), "WARN  |") << "the 0 is the first digit of the width";
    EXPECT_EQ(line("%0-6p|"), "6p|") << "- is no letter: the conversion is dropped";
    EXPECT_EQ(line("%--6p|"), "6p|");
}

TEST_F(LogFormatTest, APrecisionCutsAndACutTextIsNotPadded) {
    EXPECT_EQ(line("%.2p"), "WA");
    EXPECT_EQ(line("%10.3m", "abcdef"), "abc");
    EXPECT_EQ(line("%-10.3m|", "abcdef"), "abc|");
    EXPECT_EQ(line("%10.3m", "abc"), "       abc");
    EXPECT_EQ(line("%10.3m", "ab"), "        ab");
    EXPECT_EQ(line("%.0m|", "abc"), "|");
    EXPECT_EQ(line("%.3m", "ab"), "ab");
}

TEST_F(LogFormatTest, ADotWithoutDigitsIsNoLimit) {
    EXPECT_EQ(line("%.m", "abc"), "abc");
    EXPECT_EQ(line("%6.m", "abc"), "   abc");
}

TEST_F(LogFormatTest, WidthsSaturateInsteadOfWrapping) {
    EXPECT_EQ(line("%.4294967295m", "abc"), "abc");
    EXPECT_EQ(line("%.4294967296m", "abc"), "abc") << "not cut to nothing";
    EXPECT_EQ(line("%.99999999999999999999m", "abc"), "abc");
    EXPECT_EQ(line("%.4294967294m", "abc"), "abc");
}

TEST_F(LogFormatTest, ANewlineKeepsItsWidths) {
    EXPECT_EQ(line("%3n"), "  \n");
    EXPECT_EQ(line("%-3n|"), "\n  |");
    EXPECT_EQ(line("%.0n|"), "|");
}

TEST_F(LogFormatTest, LiteralsAndDoubledPercentSigns) {
    EXPECT_EQ(line(""), "");
    EXPECT_EQ(line("just text"), "just text");
    EXPECT_EQ(line("100%% done"), "100% done");
    EXPECT_EQ(line("%%%m", "x"), "%x");
    EXPECT_EQ(line("%%"), "%");
    EXPECT_EQ(line("%%%%"), "%%");
    EXPECT_EQ(line("a%%%%b"), "a%%b");
    EXPECT_EQ(line("%%m"), "%m");
    EXPECT_EQ(line("a%m%%b%mc", "-"), "a-%b-c");
    EXPECT_EQ(line("%5%x", "m"), "x") << "a percent sign is a letter here, one that means nothing";
}

TEST_F(LogFormatTest, UnknownLettersPrintNothing) {
    EXPECT_EQ(line("%q%m", "x"), "x");
    EXPECT_EQ(line("a%-5.3Mb"), "ab");
    EXPECT_EQ(line("%q{arg}%m", "x"), "x");
    EXPECT_EQ(line("%{abc}d%m", "x"), "abc}dx") << "the brace itself is the unknown letter";
}

TEST_F(LogFormatTest, ABraceArgumentIsAcceptedAfterAnyLetter) {
    EXPECT_EQ(line("%c{x}|"), "Foo|");
    EXPECT_EQ(line("%m{a{b}c}", "x"), "xc}");
    EXPECT_EQ(line("%m{}", "x"), "x");
    EXPECT_EQ(line("%m {x}", "x"), "x {x}");
}

TEST_F(LogFormatTest, APatternThatEndsInsideAConversionStopsBeforeIt) {
    for (const char* end :
         {"%", "%-", "%0", "%-5", "%5.", "%.", "%5.3", "%d{ISO8601", "%m{", "%q{x"}) {
        EXPECT_EQ(line(std::string("%m") + end, "x"), "x") << end;
    }
}

TEST_F(LogFormatTest, CategoryIsTheLoggersName) {
    EXPECT_EQ(line("%c"), "Foo");
}

TEST_F(LogFormatTest, ALoggerThatIsNotConstructedHasAnEmptyCategory) {
    alignas(Logger) static const unsigned char raw[sizeof(Logger)] = {};
    const LogMsgMetadata md(reinterpret_cast<const Logger*>(raw), INFO);
    std::string out;
    LogFormat("[%c]").apply(out, md, "");
    EXPECT_EQ(out, "[]");
}

TEST_F(LogFormatTest, AnUnknownLevelPrintsQuestionMarks) {
    _level = static_cast<LogLevel>(17);
    EXPECT_EQ(line("%5p"), "  ???");
}

TEST_F(LogFormatTest, TheThreadNameIsTheCallingThreads) {
    EXPECT_EQ(line("%t"), Thread::currentName());
    EXPECT_EQ(line("%t"), "Main Thread");
}

TEST_F(LogFormatTest, MillisecondsCountFromTheEpochAndRoundUp) {
    setMsecAfterEpoch(0);
    EXPECT_EQ(line("%r %R"), "0 0");
    setMsecAfterEpoch(999);
    EXPECT_EQ(line("%r %R"), "999 0");
    setMsecAfterEpoch(1000);
    EXPECT_EQ(line("%r %R"), "1000 1");
    setMsecAfterEpoch(12345);
    EXPECT_EQ(line("%8r|%-8R|%02r"), "   12345|12      |12345");
}

TEST_F(LogFormatTest, AStampBeforeTheEpochPrintsAsAVeryLargeNumber) {
    Timeval stamp = epoch_timeval();
    stamp.set(stamp.sec() - 1, 0);
    const long long msec = Timeval::msecDifference(stamp, epoch_timeval());
    ASSERT_LT(msec, 0);
    setStamp(stamp);
    EXPECT_EQ(line("%r"), std::to_string(static_cast<unsigned long long>(msec)));
    EXPECT_EQ(line("%R"), std::to_string(static_cast<unsigned long long>(msec) / 1000));
}

TEST_F(LogFormatTest, TheProcessorTimeIsInClocksOwnTicks) {
    const unsigned long long before = static_cast<unsigned long long>(std::clock());
    const unsigned long long told = std::stoull(line("%u"));
    const unsigned long long after = static_cast<unsigned long long>(std::clock());
    EXPECT_LE(before, told);
    EXPECT_LE(told, after);
}

TEST_F(LogFormatTest, ManyConversionsAllPrint) {
    for (const std::size_t n : {15U, 16U, 17U, 32U, 33U, 1000U}) {
        std::string pattern;
        for (std::size_t i = 0; i < n; ++i)
            pattern += "%m";
        EXPECT_EQ(line(pattern, "x"), std::string(n, 'x'));
    }
}

TEST_F(LogFormatTest, TwoDatesOfOneLineConvertTheStampOnce) {
    const CountCalls conversions(Call::localtime_r);
    line("%d %d{ABSOLUTE} %d{%H}");
    EXPECT_EQ(conversions.count(), 1U);
}

TEST_F(LogFormatTest, ALineWithoutADateConvertsNothing) {
    const CountCalls conversions(Call::localtime_r);
    line("%r %m");
    EXPECT_EQ(conversions.count(), 0U);
}

TEST_F(LogFormatTest, DatesAreFittedToTheirWidths) {
    setStamp(Timeval());
    EXPECT_EQ(line("%6d{x}|%-6d{x}|%.2d{xyz}"), "     x|x     |xy");
}

TEST_F(LogFormatTest, TheMessageIsNotInterpreted) {
    EXPECT_EQ(line("%m", std::string("%d\0%n", 5)), std::string("%d\0%n", 5));
}

}  // namespace
