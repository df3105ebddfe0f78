#include <korvex/util/Logger.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <new>
#include <random>
#include <stdexcept>
#include <string>

#include "support/Faults.h"

namespace {

using testsupport::Call;
using testsupport::CountCalls;
using testsupport::FailNth;

// Local time stands five and a half hours east of UTC.
class LogFormattedDateTest : public testing::Test {
  protected:
    LogFormattedDateTest() {
        setenv("TZ", "XYZ-5:30", 1);
        tzset();
        setStamp(7000);
    }
    ~LogFormattedDateTest() override {
        unsetenv("TZ");
        tzset();
    }

    // 5 March 2007, 14:03:09 local time, and the microseconds.
    void setStamp(int usec) { _md.stamp = at(1173083589, usec); }
    static Timeval at(int sec, int usec) {
        Timeval stamp;
        stamp.set(sec, usec);
        return stamp;
    }
    std::string date(const char* layout) { return date(layout, layout ? std::strlen(layout) : 0); }
    std::string date(const char* layout, unsigned long len) {
        CachedTm tm;
        std::string out;
        LogFormattedDate(layout, len).fmt(out, tm, _md);
        return out;
    }

    Logger _logger{"Foo"};
    LogMsgMetadata _md{&_logger, INFO};
};

TEST_F(LogFormattedDateTest, NamedLayouts) {
    EXPECT_EQ(date("DATE"), "05 Mar 2007 14:03:09,007");
    EXPECT_EQ(date("ABSOLUTE"), "14:03:09,007");
    EXPECT_EQ(date("ISO8601"), "2007-03-05 14:03:09,007");
}

TEST_F(LogFormattedDateTest, NoNameAndAnEmptyOneAreIso8601) {
    EXPECT_EQ(date(nullptr), "2007-03-05 14:03:09,007");
    EXPECT_EQ(date(""), "2007-03-05 14:03:09,007");
}

TEST_F(LogFormattedDateTest, TheMessageLayoutHandsItsArgumentOn) {
    std::string out;
    LogFormat("%d|%d{}|%d{DATE}|%d{%H%l}").apply(out, _md, "");
    EXPECT_EQ(out,
              "2007-03-05 14:03:09,007|2007-03-05 14:03:09,007|05 Mar 2007 14:03:09,007|14007");
}

TEST_F(LogFormattedDateTest, NamesAreComparedExactly) {
    EXPECT_EQ(date("date"), "date");
    EXPECT_EQ(date("DATEX"), "DATEX");
    EXPECT_EQ(date("DAT"), "DAT");
    EXPECT_EQ(date("ISO8601 "), "ISO8601 ");
    EXPECT_EQ(date("XISO8601"), "XISO8601");
}

TEST_F(LogFormattedDateTest, OnlyTheGivenLengthIsRead) {
    EXPECT_EQ(date("DATE}rest", 4), "05 Mar 2007 14:03:09,007");
    EXPECT_EQ(date("%H:%M}", 5), "14:03");
}

TEST_F(LogFormattedDateTest, MillisecondsHaveThreeDigitsAndAreCut) {
    const struct {
        int usec;
        const char* text;
    } all[] = {{0, "000"},      {999, "000"},     {1000, "001"},  {99999, "099"},   {100000, "100"},
               {999999, "999"}, {1234567, "123"}, {-1000, "429"}, {12345678, "123"}};
    for (const auto& expected : all) {
        setStamp(expected.usec);
        EXPECT_EQ(date("%l"), expected.text) << expected.usec;
    }
}

TEST_F(LogFormattedDateTest, MillisecondsStandAnywhere) {
    EXPECT_EQ(date("%l%H"), "00714");
    EXPECT_EQ(date("%H%l%M"), "1400703");
    EXPECT_EQ(date("%l%l"), "007007");
    EXPECT_EQ(date("a%lb"), "a007b");
}

TEST_F(LogFormattedDateTest, TheCutDoesNotKnowDoubledPercentSigns) {
    // "%%l" is a lone "%", which strftime prints as it stands, and the milliseconds.
    EXPECT_EQ(date("%%l"), "%007");
    EXPECT_EQ(date("%%H"), "%H");
}

TEST_F(LogFormattedDateTest, TheDateIsAppended) {
    CachedTm tm;
    std::string out = "at ";
    LogFormattedDate("%H", 2).fmt(out, tm, _md);
    EXPECT_EQ(out, "at 14");
}

TEST_F(LogFormattedDateTest, PiecesAroundTheLocalBufferComeOutWhole) {
    for (const std::size_t n : {62U, 63U, 64U, 65U, 127U, 128U, 129U, 10000U}) {
        const std::string text(n, 'x');
        EXPECT_EQ(date((text + "%l" + text + "%H").c_str()), text + "007" + text + "14") << n;
        EXPECT_EQ(date((text + "%P%l" + text + "%I").c_str()), text + "pm007" + text + "02") << n;
    }
}

// What strftime yields in a locale without AM and PM.
TEST_F(LogFormattedDateTest, AnEmptyAmPmPrintsNothingAndIsAskedForOnce) {
    for (const char* layout : {"%p", "%p%p", "%^p", "%_5p%Ep", "%#12Op", "%-p", "%10p"}) {
        const FailNth empty(Call::strftime, 1, EINVAL, FailNth::FROM_THEN_ON);
        EXPECT_EQ(date(layout), "") << layout;
        EXPECT_EQ(empty.count(), 1U) << layout;
    }
}

TEST_F(LogFormattedDateTest, AnAmPmThatIsNotEmptyPrints) {
    EXPECT_EQ(date("%p"), "PM");
    EXPECT_EQ(date("%l%p%l"), "007PM007");
}

TEST_F(LogFormattedDateTest, APieceThatIsEmptyForAnotherReasonThrowsInsteadOfTakingAllMemory) {
    for (const char* layout : {"%P", "%pm", " %p", "%p%", "%Z", "%_-p", "%EOp", "%p%l%j"}) {
        const FailNth empty(Call::strftime, 1, EINVAL, FailNth::FROM_THEN_ON);
        EXPECT_THROW(date(layout), std::length_error) << layout;
        EXPECT_LT(empty.count(), 40U) << layout;
    }
}

// Not the least: each number on both sides of its one-digit values, and leap seconds' neighbours.
TEST_F(LogFormattedDateTest, NumbersComeOutAsStrftimeWritesThem) {
    constexpr char pattern[] = "<%Y-%m-%dT%H:%M:%S>%Y%d";
    std::mt19937 random(1);
    std::uniform_int_distribution<int> any(INT_MIN, INT_MAX);
    for (int i = 0; i < 5000; ++i) {
        const int sec = i == 0 ? INT_MIN : i == 1 ? INT_MAX : i < 1000 ? i * 86400 : any(random);
        _md.stamp = at(sec, 0);
        struct tm local {};
        _md.stamp.localtime(local);
        char expected[64];
        ASSERT_NE(std::strftime(expected, sizeof expected, pattern, &local), 0U);
        ASSERT_EQ(date(pattern), expected) << sec;
    }
}

TEST_F(LogFormattedDateTest, YearsAloneHaveRoomForAllTheirDigits) {
    std::string years;
    std::string expected;
    for (int n = 1; n < 40; ++n) {  // with and without strftime
        years += "%Y";
        expected += "2007";
        EXPECT_EQ(date(years.c_str()), expected);
    }
}

TEST_F(LogFormattedDateTest, NumbersTakeNoStrftime) {
    const CountCalls calls(Call::strftime);
    EXPECT_EQ(date("%d.%m.%Y %H:%M:%S,%l"), "05.03.2007 14:03:09,007");
    EXPECT_EQ(calls.count(), 0U);
    EXPECT_EQ(date("%d.%m.%y"), "05.03.07");
    EXPECT_EQ(calls.count(), 1U);
}

TEST_F(LogFormattedDateTest, ALineFollowsAChangeOfTheZoneWithinTheSecond) {
    EXPECT_EQ(date("ISO8601"), "2007-03-05 14:03:09,007");
    setenv("TZ", "XYZ+1", 1);
    tzset();
    EXPECT_EQ(date("ISO8601"), "2007-03-05 07:33:09,007");
    // The same names and offsets, but other rules.
    setenv("TZ", "AAA0BBB,M6.1.0,M7.1.0", 1);
    tzset();
    EXPECT_EQ(date("%H"), "08");
    setenv("TZ", "AAA0BBB,M3.1.0,M7.1.0", 1);
    tzset();
    EXPECT_EQ(date("%H"), "09");
}

// The first piece that does not fit makes the buffer grow for all that follow.
TEST_F(LogFormattedDateTest, AWideAmPmPrintsWhereALongPieceCameBefore) {
    for (const std::size_t before : {10U, 61U, 62U, 63U, 64U, 100U}) {
        const std::string text(before - 2, 'x');
        const std::string wide = before < 64 ? "" : std::string(67, ' ') + "PM";
        EXPECT_EQ(date((text + "%H%l%69p").c_str()), text + "14007" + wide) << before;
        EXPECT_EQ(date((text + "%I%l%69p").c_str()), text + "02007" + wide) << before;
    }
}

TEST_F(LogFormattedDateTest, APieceEndsAtItsFirstNul) {
    EXPECT_EQ(date("\0\0", 2), "");
    EXPECT_EQ(date("a\0b", 3), "a");
    EXPECT_EQ(date("%p\0b", 4), "PM");
}

TEST_F(LogFormattedDateTest, AGrownBufferServesTheLaterPieces) {
    const std::string longPiece(200, 'x');
    const CountCalls calls(Call::strftime);
    date((longPiece + "%j%l" + longPiece + "%j").c_str());
    EXPECT_EQ(calls.count(), 4U) << "64, 128 and 256 bytes, then 256 at once";
}

TEST_F(LogFormattedDateTest, AWideFieldIsNoReasonToThrow) {
    for (const std::size_t width : {3000000U, 6000000U})
        EXPECT_EQ(date(("%" + std::to_string(width) + "d").c_str()).size(), width);
}

TEST_F(LogFormattedDateTest, WidthsTooLargeToCountAreTriedUntilMemoryEnds) {
    for (const char* layout :
         {"%99999999999999999999d", "%4000000000000000000d%400000000000000000d"}) {
        const FailNth empty(Call::strftime, 1, EINVAL, FailNth::FROM_THEN_ON);
        const FailNth memory(Call::new_array, 22, ENOMEM, FailNth::FROM_THEN_ON);
        EXPECT_THROW(date(layout), std::bad_alloc) << layout;
    }
}

TEST_F(LogFormattedDateTest, OneCachedTimeServesOneMessage) {
    CachedTm tm;
    char first[16];
    char second[16];
    EXPECT_EQ(tm.ftime(first, sizeof first, "%H:%M", _md), 5U);
    _md.stamp = at(0, 0);
    EXPECT_EQ(tm.ftime(second, sizeof second, "%H:%M", _md), 5U);
    EXPECT_STREQ(first, "14:03");
    EXPECT_STREQ(second, "14:03");
}

TEST_F(LogFormattedDateTest, FtimeTellsABufferTooSmall) {
    CachedTm tm;
    char buf[16];
    EXPECT_EQ(tm.ftime(buf, 5, "%H:%M", _md), 0U);
    EXPECT_EQ(tm.ftime(buf, 6, "%H:%M", _md), 5U);
}

}  // namespace
