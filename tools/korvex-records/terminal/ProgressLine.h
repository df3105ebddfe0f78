#pragma once

#include <chrono>
#include <cstdint>
#include <string>

// What the tool is at.
struct ProgressStep {
    const char* what = nullptr;  // null: nothing that should be shown
    std::uint64_t done = 0;
    std::uint64_t total = 0;  // 0: nobody knows
};

// One line for it, of at most `columns` characters: a bar and a percentage, or, where the total is
// not known, a mark that moves with the time.
std::string progressLine(const ProgressStep& step, std::chrono::milliseconds elapsed,
                         std::size_t columns);
