#pragma once

#include <cstdint>
#include <string>

// "1 record", "2 records".
inline std::string counted(std::uint64_t n, const std::string& what) {
    return std::to_string(n) + " " + what + (n == 1 ? "" : "s");
}
