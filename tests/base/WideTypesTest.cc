#include <korvex/util/Pathname.h>

#include <gtest/gtest.h>

#include <sys/types.h>

inline namespace korvex {

// This program is compiled as a consumer is: with what the library's CMake target hands on.
TEST(WideTypesTest, FileSizesAndTimesHave64BitsOnEveryMachine) {
    EXPECT_EQ(sizeof(off_t), 8u);
    EXPECT_EQ(sizeof(time_t), 8u);
}

}  // namespace korvex
