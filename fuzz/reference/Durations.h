#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// Instants and durations once more, as single numbers, and decimal digits as text.
namespace reference {

struct Instant {
    long long usec;  // since the epoch
};

constexpr Instant kMax{2147483647999999};

Instant plusSec(Instant instant, std::uint64_t seconds);
Instant plusMsec(Instant instant, std::uint64_t milliseconds);
long long msecDifference(Instant later, Instant earlier);
long long usecDifference(Instant later, Instant earlier);
std::string describe(Instant later, Instant earlier);

struct Parsed {
    std::string milliseconds;
    std::size_t count;
};
Parsed parseSeconds(const std::string& text);

}  // namespace reference
