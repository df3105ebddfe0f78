#include "korvex-records/terminal/ProgressLine.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

using std::chrono::milliseconds;

std::string lineOf(std::uint64_t done, std::uint64_t total, std::size_t columns = 24) {
    return progressLine({"scanning", done, total}, milliseconds(0), columns);
}

TEST(ProgressLineTest, TheBarGrowsWithTheShare) {
    EXPECT_EQ(lineOf(0, 200), "scanning [........]   0%");
    EXPECT_EQ(lineOf(99, 200), "scanning [###.....]  49%");
    EXPECT_EQ(lineOf(100, 200), "scanning [####....]  50%");
    EXPECT_EQ(lineOf(199, 200), "scanning [#######.]  99%");
    EXPECT_EQ(lineOf(200, 200), "scanning [########] 100%");
}

TEST(ProgressLineTest, MoreThanAllIsAll) {
    EXPECT_EQ(lineOf(300, 200), "scanning [########] 100%");
    const std::uint64_t most = std::numeric_limits<std::uint64_t>::max();
    EXPECT_EQ(lineOf(most, most), "scanning [########] 100%");
    EXPECT_EQ(lineOf(most / 2, most), "scanning [####....]  50%");
}

TEST(ProgressLineTest, ItNeverIsWiderThanItMay) {
    EXPECT_EQ(lineOf(1, 2, 21), "scanning [##...]  50%");
    EXPECT_EQ(lineOf(1, 2, 20), "scanning  50%");
    EXPECT_EQ(lineOf(1, 2, 13), "scanning  50%");
    EXPECT_EQ(lineOf(1, 2, 12), "scanning  50");
    EXPECT_EQ(lineOf(1, 2, 0), "");
    EXPECT_EQ(lineOf(1, 2, 1000),
              "scanning [" + std::string(20, '#') + std::string(20, '.') + "]  50%");
}

TEST(ProgressLineTest, WithoutATotalAMarkMovesThereAndBack) {
    const auto after = [](int tenths) {
        return progressLine({"reading", 0, 0}, milliseconds(100 * tenths), 20);
    };
    EXPECT_EQ(after(0), "reading [###..]");
    EXPECT_EQ(after(1), "reading [.###.]");
    EXPECT_EQ(after(2), "reading [..###]");
    EXPECT_EQ(after(3), "reading [.###.]");
    EXPECT_EQ(after(4), "reading [###..]");
    EXPECT_EQ(progressLine({"reading", 0, 0}, milliseconds(0), 19), "reading");
}

}  // namespace
