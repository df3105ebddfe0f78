#pragma once

inline namespace korvex {

// Writes a number below 100 as two digits. Returns the place after them.
inline char* twoDigits(char* to, int value) {
    *to++ = static_cast<char>('0' + value / 10);
    *to++ = static_cast<char>('0' + value % 10);
    return to;
}

}  // namespace korvex
