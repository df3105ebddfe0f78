#include <korvex/util/Timeval.h>

#include <cstdio>

inline namespace korvex {

namespace {

std::string whole(long long n, const char* unit) {
    char buf[40];
    std::snprintf(buf, sizeof buf, "%lld", n);
    return std::string(buf) + unit;
}

// About three significant digits, at least five characters wide.
std::string fractional(double value, const char* unit) {
    const int precision = value >= 99.5 ? 1 : value >= 9.95 ? 2 : 3;
    char buf[40];
    std::snprintf(buf, sizeof buf, "%5.*f", precision, value);
    return std::string(buf) + unit;
}

}  // namespace

std::string Timeval::describeDifference(const Timeval& later, const Timeval& earlier) {
    const bool negative = later < earlier;
    const std::string sign = negative ? "-" : "";
    const long long d = negative ? usecDifference(earlier, later) : usecDifference(later, earlier);
    const double v = static_cast<double>(d);
    if (v > 8e9) return sign + fractional(v / 3.6e9, " hours");
    if (v > 3e6) return sign + fractional(v / 1e6, " seconds");
    if (v > 3000) {
        const bool exact = later._tv.tv_usec % 1000 == 0 && earlier._tv.tv_usec % 1000 == 0;
        return sign +
               (exact ? whole(d / 1000, " milliseconds") : fractional(v / 1000.0, " milliseconds"));
    }
    return sign + whole(d, d == 1 ? " microsecond" : " microseconds");
}

}  // namespace korvex
