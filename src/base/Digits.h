#pragma once

inline namespace korvex {

// Writes a number below 100 in two digits; behind them.
inline char* twoDigits(char* to, int value) {
    *to++ = static_cast<char>('0' + value / 10);
    *to++ = static_cast<char>('0' + value % 10);
    return to;
}

}  // namespace korvex
