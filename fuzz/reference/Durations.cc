#include "reference/Durations.h"

#include <algorithm>
#include <cstdio>

namespace reference {

namespace {

const std::string kAllOnes = "18446744073709551615";

std::string withoutZeros(const std::string& digits) {
    const std::size_t first = digits.find_first_not_of('0');
    return first == digits.npos ? "0" : digits.substr(first);
}

bool isGreater(const std::string& a, const std::string& b) {
    return a.size() != b.size() ? a.size() > b.size() : a > b;
}

// One more, in decimal digits.
std::string plusOne(std::string digits) {
    std::size_t at = digits.size();
    while (at > 0 && digits[at - 1] == '9')
        digits[--at] = '0';
    if (at == 0) return "1" + digits;
    ++digits[at - 1];
    return digits;
}

std::string number(double value) {
    char buffer[40];
    std::snprintf(buffer, sizeof buffer, "%5.*f", value >= 99.5 ? 1 : value >= 9.95 ? 2 : 3, value);
    return buffer;
}

}  // namespace

Instant plusSec(Instant instant, std::uint64_t seconds) {
    const long long sum = instant.usec + static_cast<long long>(seconds) * 1000000;
    return sum > kMax.usec ? kMax : Instant{sum};
}

Instant plusMsec(Instant instant, std::uint64_t milliseconds) {
    if (milliseconds >= 2147483647000) return kMax;
    const long long sum = instant.usec + static_cast<long long>(milliseconds) * 1000;
    return sum > kMax.usec ? kMax : Instant{sum};
}

// The next whole millisecond that is not before the distance.
long long msecDifference(Instant later, Instant earlier) {
    const long long usec = later.usec - earlier.usec;
    return usec / 1000 + (usec % 1000 > 0 ? 1 : 0);
}

long long usecDifference(Instant later, Instant earlier) {
    const long long usec = later.usec - earlier.usec;
    long long seconds = usec / 1000000;
    if (usec % 1000000 < 0) --seconds;
    return seconds * 1000000 + (usec - seconds * 1000000) / 1000;
}

std::string describe(Instant later, Instant earlier) {
    if (later.usec < earlier.usec) return "-" + describe(earlier, later);
    const long long d = usecDifference(later, earlier);
    const auto v = static_cast<double>(d);
    if (v > 8e9) return number(v / 3.6e9) + " hours";
    if (v > 3e6) return number(v / 1e6) + " seconds";
    if (v <= 3000) return std::to_string(d) + (d == 1 ? " microsecond" : " microseconds");
    if (later.usec % 1000 == 0 && earlier.usec % 1000 == 0) {
        return std::to_string(d / 1000) + " milliseconds";
    }
    return number(v / 1000.0) + " milliseconds";
}

Parsed parseSeconds(const std::string& text) {
    const auto digitsFrom = [&](std::size_t at) {
        const std::size_t end = text.find_first_not_of("0123456789", at);
        return text.substr(at, end == text.npos ? end : end - at);
    };
    const std::size_t start = std::min(text.find_first_not_of(" \t"), text.size());
    const std::string whole = digitsFrom(start);
    std::size_t at = start + whole.size();
    std::string fraction;
    const bool dot = at < text.size() && text[at] == '.' &&
                     (at + 1 == text.size() || !digitsFrom(at + 1).empty());
    if (dot) {
        fraction = digitsFrom(at + 1);
        at += 1 + fraction.size();
    }
    if (at == start) return {"0", 0};

    const bool positive = fraction.find_first_not_of('0') != fraction.npos;
    fraction.resize(std::max<std::size_t>(fraction.size(), 4), '0');
    std::string milliseconds = withoutZeros(whole + fraction.substr(0, 3));
    if (fraction[3] >= '5') milliseconds = plusOne(milliseconds);
    if (positive && milliseconds == "0") milliseconds = "1";
    // The whole seconds saturate by themselves: a number just below may still be reached by them.
    if (isGreater(withoutZeros(whole), "18446744073709551") || isGreater(milliseconds, kAllOnes)) {
        milliseconds = kAllOnes;
    }
    return {milliseconds, at};
}

}  // namespace reference
