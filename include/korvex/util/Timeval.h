#pragma once

#include <korvex/Export.h>

#include <sys/time.h>

#include <ctime>
#include <string>

KORVEX_NAMESPACE(korvex) {

// A wall-clock instant: seconds and microseconds since the Unix epoch. Seconds keep to the signed
// 32-bit range whatever the platform's time_t is: additions and the clock saturate at the largest
// instant ("max", 2147483647 s 999999 us) instead of wrapping. A plain value.
class Timeval {
  public:
    // The Unix epoch.
    Timeval() = default;

    // The current time, as gettimeofday(2) tells it. A clock past 2038 is max. When the call fails
    // the process aborts: the rest of the system takes the clock for infallible.
    void setToNow();
    static Timeval now();

    // The largest instant.
    void setToMax();
    // sec: any; usec: microseconds within the second, 0 to 999999.
    void set(int sec, int usec);

    // Whole seconds.
    int sec() const { return static_cast<int>(_tv.tv_sec); }
    // Milliseconds within the second, cut: 0 to 999.
    int msec() const { return static_cast<int>(_tv.tv_usec) / 1000; }

    // Add a time span; a sum beyond max is max.
    void addSec(unsigned int secs);
    void addMsec(unsigned long long msecs);

    // The instant as local calendar fields, by localtime_r(3); aborts the process when that fails.
    void localtime(struct tm& out) const;

    // Which instant comes first, to the microsecond.
    bool operator<(const Timeval& other) const;
    bool operator<=(const Timeval& other) const;
    bool operator>(const Timeval& other) const { return other < *this; }
    bool operator>=(const Timeval& other) const { return other <= *this; }

    // Milliseconds from `earlier` to `later`, a remainder of microseconds counted as one more:
    // 1 us is 1 ms, -1 us is 0. Negative when `later` comes first.
    static long long msecDifference(const Timeval& later, const Timeval& earlier);
    // Whole seconds times a million plus the rest in MILLIseconds: 2.5 s are 2000500. Callers rely
    // on it, describeDifference among them; compute true microseconds yourself.
    static long long usecDifference(const Timeval& later, const Timeval& earlier);
    // The distance for people: "2.500 hours", "42.00 seconds", "2000 milliseconds", "0
    // microseconds", with "-" in front when `later` comes first. Built on usecDifference, so what
    // is less than a second shows as a thousandth of itself: 3.25 s are "3.000 seconds", 1 ms is
    // "1 microsecond". Throws std::bad_alloc.
    static std::string describeDifference(const Timeval& later, const Timeval& earlier);

    // The same from this instant to now.
    long long msecSince() const { return msecDifference(now(), *this); }
    long long usecSince() const { return usecDifference(now(), *this); }
    std::string describeSince() const { return describeDifference(now(), *this); }

  private:
    void setSaturated(long long sec);

    struct timeval _tv {};
};

// A Timeval that starts as the current time.
class CurrentTimeval : public Timeval {
  public:
    // Aborts the process when the clock fails, as setToNow() does.
    CurrentTimeval() { setToNow(); }
    // A copy keeps its source's instant, and an assignment takes it: neither looks at the clock.
    CurrentTimeval(const CurrentTimeval&) = default;
    CurrentTimeval& operator=(const CurrentTimeval&) = default;
    CurrentTimeval& operator=(const Timeval& other) {
        Timeval::operator=(other);
        return *this;
    }
    ~CurrentTimeval() = default;
};

// Reads a duration in seconds, decimal digits with an optional fraction ("2", "1.5", ".25", "5."),
// after leading blanks and tabs, into *res as milliseconds. There is no sign, exponent or unit: the
// caller looks at what follows by *charCount, the number of characters read from p on (leading
// blanks included; charCount may be null). The fraction's first four digits count, half a
// millisecond rounds up, and a positive duration is never less than 1. A number too large for 64
// bits gives 18446744073709551615 and success. False, *res 0 and *charCount 0, when there is
// nothing to read. p must be NUL-terminated.
KORVEX_EXPORT bool convert_string_to_milliseconds(const char* p, unsigned long long* res,
                                                  unsigned long* charCount);

}  // KORVEX_NAMESPACE(korvex)
