#include <korvex/util/Timeval.h>

#include <limits>

inline namespace korvex {

namespace {

using Millis = unsigned long long;

constexpr Millis kMost = std::numeric_limits<Millis>::max();

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

unsigned digitOf(char c) {
    return static_cast<unsigned>(c - '0');
}

// The whole seconds as milliseconds. False when there are too many; all digits are consumed.
bool readSeconds(const char*& p, Millis& res) {
    Millis n = 0;
    bool fits = true;
    for (; isDigit(*p); ++p) {
        if (fits) n = n * 10 + digitOf(*p);
        if (n > kMost / 1000) fits = false;
    }
    if (fits) res = n * 1000;
    return fits;
}

// Adds the fraction after the '.', which was consumed. False if the sum is too large.
bool addFraction(const char*& p, Millis& res) {
    constexpr int kept = 4;
    unsigned fraction = 0;  // in units of 100 microseconds
    bool positive = false;
    int count = 0;
    for (; isDigit(*p); ++p, ++count) {
        if (count < kept) fraction = fraction * 10 + digitOf(*p);
        if (*p != '0') positive = true;
    }
    for (; count < kept; ++count)
        fraction *= 10;
    const Millis millis = (fraction + 5) / 10;
    if (res > kMost - millis) return false;
    res += millis;
    if (positive && res == 0) res = 1;
    return true;
}

}  // namespace

bool convert_string_to_milliseconds(const char* p, unsigned long long* res,
                                    unsigned long* charCount) {
    const char* const begin = p;
    while (*p == ' ' || *p == '\t')
        ++p;
    const char* const start = p;
    *res = 0;
    bool fits = readSeconds(p, *res);
    if (*p == '.' && (isDigit(p[1]) || p[1] == '\0')) {
        ++p;
        fits = addFraction(p, *res) && fits;
    }
    if (!fits) *res = kMost;
    const bool found = p != start;
    if (charCount != nullptr) *charCount = found ? static_cast<unsigned long>(p - begin) : 0;
    return found;
}

}  // namespace korvex
