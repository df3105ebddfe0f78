#include "korvex-records/terminal/Histogram.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

TEST(HistogramTest, TheMedianOfAnEvenNumberIsTheSmallerOne) {
    EXPECT_EQ(Histogram({5, 1, 9, 2}).median(), 2U);
    EXPECT_EQ(Histogram({5, 1, 9}).median(), 5U);
    EXPECT_EQ(Histogram({7}).median(), 7U);
}

TEST(HistogramTest, TheExtremesAndTheSumDoNotDependOnTheOrder) {
    const Histogram sizes({5, 1, 9});
    EXPECT_EQ(sizes.smallest(), 1U);
    EXPECT_EQ(sizes.largest(), 9U);
    EXPECT_EQ(sizes.sum(), 15U);
}

TEST(HistogramTest, OfNothingAllIsZero) {
    const Histogram none({});
    EXPECT_EQ(none.sum() + none.smallest() + none.median() + none.largest(), 0U);
}

TEST(HistogramTest, EachPowerOfTwoHasItsLine) {
    EXPECT_EQ(Histogram({0, 1, 2, 3, 4, 7, 8}).bars(4),
              "                     0          1  ##\n"
              "                     1          1  ##\n"
              "                  2..3          2  ####\n"
              "                  4..7          2  ####\n"
              "                 8..15          1  ##\n");
}

TEST(HistogramTest, LinesStandFromTheFirstThatOccursToTheLast) {
    EXPECT_EQ(Histogram({2, 8}).bars(3),
              "                  2..3          1  ###\n"
              "                  4..7          0\n"
              "                 8..15          1  ###\n");
}

TEST(HistogramTest, WhatIsRareIsSeenAllTheSame) {
    std::vector<std::uint64_t> sizes(1000, 1);
    sizes.push_back(2);
    EXPECT_EQ(Histogram(sizes).bars(5),
              "                     1       1000  #####\n"
              "                  2..3          1  #\n");
}

TEST(HistogramTest, TheLargestValueHasItsPlace) {
    EXPECT_EQ(Histogram({std::numeric_limits<std::uint32_t>::max()}).bars(1),
              "2147483648..4294967295          1  #\n");
}

}  // namespace
