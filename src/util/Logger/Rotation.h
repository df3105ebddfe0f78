#pragma once

#include <cstdint>

inline namespace korvex {

// The first number below `limit` for which exists(number) is false; `limit` when there is none.
template <class Exists>
std::uint32_t firstGap(std::uint32_t limit, Exists exists) {
    std::uint32_t k = 0;
    while (k < limit && exists(k))
        ++k;
    return k;
}

}  // namespace korvex
