#pragma once

#include <korvex/Export.h>

#include <sys/time.h>

#include <ctime>
#include <string>

KORVEX_NAMESPACE(korvex) {

// A wall-clock instant: seconds and microseconds since the Unix epoch. The seconds stay in the
// signed 32-bit range, whatever the platform's time_t is. Additions and the clock saturate at the
// largest instant ("max", 2147483647 s 999999 us); they never wrap. A plain value.
class Timeval {
  public:
    // The Unix epoch.
    Timeval() = default;

    // The current time by gettimeofday(2). A time after the last instant becomes max. If the call
    // fails, the process aborts: all other code relies on the clock.
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

    // Add a time span. A sum beyond max is max.
    void addSec(unsigned int secs);
    void addMsec(unsigned long long msecs);

    // The instant as local calendar fields, by localtime_r(3). If that fails, the process aborts.
    void localtime(struct tm& out) const;

    // Compare instants, to the microsecond.
    bool operator<(const Timeval& other) const;
    bool operator<=(const Timeval& other) const;
    bool operator>(const Timeval& other) const { return other < *this; }
    bool operator>=(const Timeval& other) const { return other <= *this; }

    // Milliseconds from `earlier` to `later`, rounded up: 1 us is 1 ms, -1 us is 0. Negative if
    // `later` comes first.
    static long long msecDifference(const Timeval& later, const Timeval& earlier);
    // Not microseconds, despite its name: whole seconds times a million, plus the rest in
    // MILLIseconds. 2.5 s are 2000500. Existing callers and describeDifference rely on it. Compute
    // true microseconds yourself.
    static long long usecDifference(const Timeval& later, const Timeval& earlier);
    // The difference as a text for people: "2.500 hours", "42.00 seconds", "2000 milliseconds", "0
    // microseconds", with "-" in front if `later` comes first. It uses usecDifference, so the part
    // below one second is a thousand times too small: 3.25 s are "3.000 seconds", 1 ms is
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
    // Aborts the process if the clock fails, as setToNow() does.
    CurrentTimeval() { setToNow(); }
    // A copy and an assignment take the instant of the source. Neither reads the clock.
    CurrentTimeval(const CurrentTimeval&) = default;
    CurrentTimeval& operator=(const CurrentTimeval&) = default;
    CurrentTimeval& operator=(const Timeval& other) {
        Timeval::operator=(other);
        return *this;
    }
    ~CurrentTimeval() = default;
};

// Reads a duration in seconds and stores it in *res as milliseconds. The text has decimal digits
// with an optional fraction ("2", "1.5", ".25", "5."), after leading blanks and tabs. It has no
// sign, exponent or unit. *charCount is the number of characters that were read from p, leading
// blanks included, so that the caller can check what follows; charCount may be null. The first four
// digits of the fraction count. Half a millisecond rounds up, and a positive duration is at
// least 1. A number too large for 64 bits gives 18446744073709551615 and success. If there is no
// number, the result is false, and *res and *charCount are 0. p must be NUL-terminated.
KORVEX_EXPORT bool convert_string_to_milliseconds(const char* p, unsigned long long* res,
                                                  unsigned long* charCount);

}  // KORVEX_NAMESPACE(korvex)
