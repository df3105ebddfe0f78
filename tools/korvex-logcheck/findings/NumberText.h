#pragma once

#include <string>
#include <string_view>

// The plain number that a value surely means: "10485760" for "10 MB" (of 1024 each, as elsewhere),
// "1000" for "1,000", "+1000" and "01000". Empty when nothing is sure.
struct MeantNumber {
    std::string digits;
    bool unit;  // it came with one
};
MeantNumber meantNumber(std::string_view text);
