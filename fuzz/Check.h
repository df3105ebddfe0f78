#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>

// What a fuzzer found wrong ends it; libFuzzer then keeps the input.

inline void check(bool right, const char* what) {
    if (right) return;
    std::fprintf(stderr, "wrong: %s\n", what);
    std::abort();
}

inline void checkSame(const std::string& got, const std::string& expected, const char* what) {
    if (got == expected) return;
    std::fprintf(stderr, "%s: got \"%s\" (%zu bytes), expected \"%s\" (%zu bytes)\n", what,
                 got.c_str(), got.size(), expected.c_str(), expected.size());
    std::abort();
}
