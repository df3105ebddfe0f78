#include <korvex/util/Timeval.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <csignal>
#include <cstdlib>
#include <ctime>
#include <limits>
#include <string>

#include "support/Child.h"
#include "support/Faults.h"

namespace {

using testsupport::Call;
using testsupport::FailNth;
using testsupport::runInChild;
using testsupport::ShiftNth;

Timeval at(int sec, int usec) {
    Timeval t;
    t.set(sec, usec);
    return t;
}

bool same(const Timeval& a, const Timeval& b) {
    return a <= b && b <= a;
}

const Timeval kMax = at(INT_MAX, 999999);

TEST(TimevalTest, StartsAtTheEpoch) {
    EXPECT_TRUE(same(Timeval(), at(0, 0)));
}

TEST(TimevalTest, SetToMaxIsTheLargestInstant) {
    Timeval t;
    t.setToMax();
    EXPECT_EQ(t.sec(), INT_MAX);
    EXPECT_EQ(t.msec(), 999);
    EXPECT_TRUE(same(t, kMax));
}

TEST(TimevalTest, NowLiesBetweenTwoReadingsOfTheClock) {
    const time_t before = std::time(nullptr);
    const Timeval now = Timeval::now();
    const CurrentTimeval current;
    EXPECT_LE(before, now.sec());
    EXPECT_TRUE(now <= current);
    EXPECT_LE(current.sec(), std::time(nullptr) + 1);
}

TEST(TimevalTest, AClockBeyondTheRangeReadsAsItsNearestEnd) {
    if (sizeof(time_t) < 8) GTEST_SKIP() << "no clock can show it with a time_t of 32 bits";
    const auto shifted = [](long long by) {
        const ShiftNth fault(Call::gettimeofday, 1, by);
        return Timeval::now();
    };
    EXPECT_TRUE(same(shifted(INT_MAX), kMax));
    EXPECT_EQ(shifted(std::numeric_limits<long long>::min() / 4).sec(), INT_MIN);
    const long long left = INT_MAX - std::time(nullptr);
    // The range's last second has milliseconds like any other. (The clock may go on between.)
    Timeval last = shifted(left);
    for (int i = 0; i < 10 && last.msec() == 999; ++i)
        last = shifted(INT_MAX - std::time(nullptr));
    EXPECT_EQ(last.sec(), INT_MAX);
    EXPECT_NE(last.msec(), 999);
    EXPECT_GT(shifted(left - 3600).sec(), INT_MAX - 3700);
    EXPECT_LT(shifted(left - 3600).sec(), INT_MAX);
}

TEST(TimevalTest, ACurrentTimevalCanBeSet) {
    CurrentTimeval t;
    t = at(5, 7000);
    EXPECT_TRUE(same(t, at(5, 7000)));
    const CurrentTimeval& self = t;
    t = self;
    EXPECT_TRUE(same(t, at(5, 7000)));
}

TEST(TimevalTest, AFailingClockAborts) {
    const auto result = runInChild([] {
        const FailNth fault(Call::gettimeofday, 1, EFAULT);
        Timeval::now();
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_EQ(result.err, "");
}

TEST(TimevalTest, AFailingCalendarAborts) {
    const auto result = runInChild([] {
        const FailNth fault(Call::localtime_r, 1, EOVERFLOW);
        struct tm tm {};
        Timeval().localtime(tm);
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_EQ(result.err, "");
}

TEST(TimevalTest, LocalTimeFollowsTheZone) {
    setenv("TZ", "XYZ-5:30", 1);
    tzset();
    struct tm tm {};
    at(0, 0).localtime(tm);
    unsetenv("TZ");
    tzset();
    EXPECT_EQ(tm.tm_year, 70);
    EXPECT_EQ(tm.tm_hour, 5);
    EXPECT_EQ(tm.tm_min, 30);
}

TEST(TimevalTest, MsecIsTheMillisecondsWithinTheSecond) {
    EXPECT_EQ(at(3, 999).msec(), 0);
    EXPECT_EQ(at(3, 1000).msec(), 1);
    EXPECT_EQ(at(3, 999999).msec(), 999);
}

TEST(TimevalTest, AddSecSaturates) {
    const auto sum = [](Timeval t, unsigned secs) {
        t.addSec(secs);
        return t;
    };
    EXPECT_TRUE(same(sum(at(1, 5), 2), at(3, 5)));
    EXPECT_TRUE(same(sum(at(INT_MAX - 1, 5), 1), at(INT_MAX, 5)));
    EXPECT_TRUE(same(sum(at(INT_MAX, 5), 0), at(INT_MAX, 5)));
    EXPECT_TRUE(same(sum(at(INT_MAX, 5), 1), kMax));
    EXPECT_TRUE(same(sum(at(0, 5), 0x80000000U), kMax));
    EXPECT_TRUE(same(sum(at(0, 5), UINT_MAX), kMax));
    EXPECT_TRUE(same(sum(at(INT_MIN, 5), UINT_MAX), at(INT_MAX, 5)));
    EXPECT_TRUE(same(sum(at(-1, 5), 0x80000000U), at(INT_MAX, 5)));
}

TEST(TimevalTest, AddMsecCarriesAndSaturates) {
    const auto sum = [](Timeval t, unsigned long long msecs) {
        t.addMsec(msecs);
        return t;
    };
    EXPECT_TRUE(same(sum(at(10, 600000), 1500), at(12, 100000)));
    EXPECT_TRUE(same(sum(at(10, 999), 999), at(10, 999999)));
    EXPECT_TRUE(same(sum(at(10, 1000), 999), at(11, 0)));
    EXPECT_TRUE(same(sum(at(10, 999999), 999), at(11, 998999)));
    EXPECT_TRUE(same(sum(at(0, 5), 2147483646999ULL), at(2147483646, 999005)));
    EXPECT_TRUE(same(sum(at(-9, 0), 2147483647000ULL), kMax));
    EXPECT_TRUE(same(sum(at(-9, 0), ULLONG_MAX), kMax));
    EXPECT_TRUE(same(sum(at(INT_MAX, 0), 999), at(INT_MAX, 999000)));
    EXPECT_TRUE(same(sum(at(INT_MAX, 1000), 999), kMax)) << "the carry saturates too";
    EXPECT_TRUE(same(sum(at(INT_MAX, 0), 1000), kMax));
    EXPECT_TRUE(same(sum(at(INT_MIN, 0), 1000), at(INT_MIN + 1, 0)));
}

TEST(TimevalTest, AddMsecToMicrosecondsOutOfRangeIsAnAssertion) {
    const auto result = runInChild([] {
        Timeval t = at(0, 1500000);
        t.addMsec(500);
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_NE(result.err.find("src/util/Timeval"), std::string::npos);
    EXPECT_NE(result.err.find(": failed assertion `_tv.tv_usec < 2000000'\n"), std::string::npos);
}

TEST(TimevalTest, ComparesSecondsThenMicroseconds) {
    const Timeval a = at(1, 900000);
    const Timeval b = at(2, 100000);
    const Timeval c = at(2, 100001);
    EXPECT_TRUE(a < b && b < c && a < c);
    EXPECT_FALSE(b < a || c < b || b < b);
    EXPECT_TRUE(a <= b && b <= b && !(c <= b) && !(b <= a));
    EXPECT_TRUE(c > b && b > a && !(b > b));
    EXPECT_TRUE(c >= b && b >= b && !(a >= b));
    EXPECT_TRUE(at(-1, 0) < at(0, 0));
}

TEST(TimevalTest, MsecDifferenceRoundsUp) {
    EXPECT_EQ(Timeval::msecDifference(at(5, 0), at(5, 0)), 0);
    EXPECT_EQ(Timeval::msecDifference(at(5, 1), at(5, 0)), 1);
    EXPECT_EQ(Timeval::msecDifference(at(5, 1000), at(5, 0)), 1);
    EXPECT_EQ(Timeval::msecDifference(at(5, 1001), at(5, 0)), 2);
    EXPECT_EQ(Timeval::msecDifference(at(5, 0), at(5, 1)), 0);
    EXPECT_EQ(Timeval::msecDifference(at(5, 0), at(5, 1000)), -1);
    EXPECT_EQ(Timeval::msecDifference(at(5, 0), at(5, 500000)), -500);
    EXPECT_EQ(Timeval::msecDifference(at(7, 500000), at(5, 0)), 2500);
    EXPECT_EQ(Timeval::msecDifference(at(INT_MAX, 0), at(INT_MIN, 0)), 4294967295000LL);
}

TEST(TimevalTest, UsecDifferenceCountsTheRestInMilliseconds) {
    EXPECT_EQ(Timeval::usecDifference(at(2, 500000), at(0, 0)), 2000500);
    EXPECT_EQ(Timeval::usecDifference(at(0, 999), at(0, 0)), 0);
    EXPECT_EQ(Timeval::usecDifference(at(0, 1000), at(0, 0)), 1);
    EXPECT_EQ(Timeval::usecDifference(at(0, 0), at(0, 1)), -1000000 + 999);
    EXPECT_EQ(Timeval::usecDifference(at(1, 0), at(0, 1000)), 999);
    EXPECT_EQ(Timeval::usecDifference(at(INT_MIN, 0), at(INT_MAX, 0)), -4294967295000000LL);
}

TEST(TimevalTest, DescribesADistance) {
    const auto text = [](int sec, int usec) {
        return Timeval::describeDifference(at(sec, usec), at(0, 0));
    };
    EXPECT_EQ(text(0, 0), "0 microseconds");
    EXPECT_EQ(text(0, 1000), "1 microsecond");
    EXPECT_EQ(text(0, 2000), "2 microseconds");
    EXPECT_EQ(text(0, 999999), "999 microseconds");
    EXPECT_EQ(text(1, 0), "1000 milliseconds");
    EXPECT_EQ(text(3, 0), "3000 milliseconds") << "3e6 itself is not above the bound";
    EXPECT_EQ(text(3, 1000), "3.000 seconds");
    EXPECT_EQ(text(2, 999), "2000.0 milliseconds");
    EXPECT_EQ(text(9, 0), "9.000 seconds");
    EXPECT_EQ(text(10, 0), "10.00 seconds");
    EXPECT_EQ(text(120, 0), "120.0 seconds");
    EXPECT_EQ(text(7000, 0), "7000.0 seconds");
    EXPECT_EQ(text(8000, 0), "8000.0 seconds") << "8e9 itself is not above the bound";
    EXPECT_EQ(text(8000, 1000), "2.222 hours");
    EXPECT_EQ(text(9000, 0), "2.500 hours");
    EXPECT_EQ(text(INT_MAX, 0), "596523.2 hours");
}

TEST(TimevalTest, ThePrecisionFollowsTheValue) {
    const auto seconds = [](int sec) { return Timeval::describeDifference(at(sec, 0), at(0, 0)); };
    EXPECT_EQ(seconds(99), "99.00 seconds");
    EXPECT_EQ(seconds(100), "100.0 seconds");
    EXPECT_EQ(seconds(35640), "9.900 hours");
    EXPECT_EQ(seconds(35820), " 9.95 hours") << "padded to five characters";
    EXPECT_EQ(seconds(357840), "99.40 hours");
    EXPECT_EQ(seconds(358200), " 99.5 hours");
}

TEST(TimevalTest, ADistanceBackwardsHasASign) {
    EXPECT_EQ(Timeval::describeDifference(at(0, 0), at(120, 0)), "-120.0 seconds");
    EXPECT_EQ(Timeval::describeDifference(at(0, 0), at(0, 1000)), "-1 microsecond");
}

TEST(TimevalTest, MillisecondsAreWholeOnlyWhenBothEndsAre) {
    EXPECT_EQ(Timeval::describeDifference(at(2, 5000), at(0, 1000)), "2000 milliseconds");
    EXPECT_EQ(Timeval::describeDifference(at(2, 5001), at(0, 1001)), "2000.0 milliseconds");
    EXPECT_EQ(Timeval::describeDifference(at(2, 5000), at(0, 1001)), "2000.0 milliseconds");
}

TEST(TimevalTest, SinceCountsUpToNow) {
    Timeval past = Timeval::now();
    past.set(past.sec() - 9000, 0);
    EXPECT_GE(past.msecSince(), 9000000);
    EXPECT_LT(past.msecSince(), 9100000);
    EXPECT_GE(past.usecSince(), 9000000000LL);
    EXPECT_EQ(past.describeSince().substr(0, 3), "2.5");
}

struct Parsed {
    bool found;
    unsigned long long res;
    unsigned long count;
};

bool operator==(const Parsed& a, const Parsed& b) {
    return a.found == b.found && a.res == b.res && a.count == b.count;
}

std::ostream& operator<<(std::ostream& out, const Parsed& p) {
    return out << p.found << ' ' << p.res << ' ' << p.count;
}

Parsed parse(const char* s) {
    Parsed p{false, 77, 77};
    p.found = convert_string_to_milliseconds(s, &p.res, &p.count);
    unsigned long long again = 78;
    EXPECT_EQ(convert_string_to_milliseconds(s, &again, nullptr), p.found);
    EXPECT_EQ(again, p.res);
    return p;
}

TEST(ParseSecondsTest, WholeSecondsAndFractions) {
    EXPECT_EQ(parse("2"), (Parsed{true, 2000, 1}));
    EXPECT_EQ(parse(" 1.5s"), (Parsed{true, 1500, 4}));
    EXPECT_EQ(parse("\t 12"), (Parsed{true, 12000, 4}));
    EXPECT_EQ(parse(".25"), (Parsed{true, 250, 3}));
    EXPECT_EQ(parse("5."), (Parsed{true, 5000, 2}));
    EXPECT_EQ(parse("5.x"), (Parsed{true, 5000, 1}));
    EXPECT_EQ(parse("5. "), (Parsed{true, 5000, 1}));
    EXPECT_EQ(parse("."), (Parsed{true, 0, 1}));
    EXPECT_EQ(parse("007"), (Parsed{true, 7000, 3}));
    EXPECT_EQ(parse("1.2.3"), (Parsed{true, 1200, 3}));
    EXPECT_EQ(parse("1e3"), (Parsed{true, 1000, 1}));
}

TEST(ParseSecondsTest, NothingToRead) {
    for (const char* s : {"", "  ", "-1", "+1", "abc", ".x", "\n1"}) {
        EXPECT_EQ(parse(s), (Parsed{false, 0, 0})) << s;
    }
}

TEST(ParseSecondsTest, FourDigitsCountAndHalfRoundsUp) {
    EXPECT_EQ(parse(".0005"), (Parsed{true, 1, 5}));
    EXPECT_EQ(parse("1.0004"), (Parsed{true, 1000, 6}));
    EXPECT_EQ(parse("1.00049999"), (Parsed{true, 1000, 10}));
    EXPECT_EQ(parse("1.0015"), (Parsed{true, 1002, 6}));
    EXPECT_EQ(parse(".9995"), (Parsed{true, 1000, 5}));
    EXPECT_EQ(parse(".9994"), (Parsed{true, 999, 5}));
}

TEST(ParseSecondsTest, APositiveDurationIsNeverZero) {
    EXPECT_EQ(parse("0.0001"), (Parsed{true, 1, 6}));
    EXPECT_EQ(parse("0.000000001"), (Parsed{true, 1, 11}));
    EXPECT_EQ(parse("0.0000"), (Parsed{true, 0, 6}));
}

TEST(ParseSecondsTest, TooMuchIsAllOnes) {
    EXPECT_EQ(parse("18446744073709551"), (Parsed{true, 18446744073709551000ULL, 17}));
    EXPECT_EQ(parse("18446744073709551.615"), (Parsed{true, ULLONG_MAX, 21}));
    EXPECT_EQ(parse("18446744073709551.614"), (Parsed{true, ULLONG_MAX - 1, 21}));
    EXPECT_EQ(parse("18446744073709551.616"), (Parsed{true, ULLONG_MAX, 21}));
    EXPECT_EQ(parse("18446744073709552"), (Parsed{true, ULLONG_MAX, 17}));
    EXPECT_EQ(parse("99999999999999999"), (Parsed{true, ULLONG_MAX, 17}));
    EXPECT_EQ(parse("99999999999999999999999999999.5x"), (Parsed{true, ULLONG_MAX, 31}));
}

}  // namespace
