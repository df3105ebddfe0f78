#include <korvex/Version.h>

#include <gtest/gtest.h>

#include <string>

inline namespace korvex {

TEST(VersionTest, TheMacrosAreTheProjectsVersion) {
    EXPECT_STREQ(KORVEX_VERSION_STRING, KORVEX_PROJECT_VERSION);
    EXPECT_EQ(std::to_string(KORVEX_VERSION_MAJOR) + "." + std::to_string(KORVEX_VERSION_MINOR) +
                  "." + std::to_string(KORVEX_VERSION_PATCH),
              KORVEX_PROJECT_VERSION);
}

TEST(VersionTest, TheNumberCanBeComparedByThePreprocessor) {
#if KORVEX_VERSION_NUMBER >= 10000 && KORVEX_VERSION_NUMBER < 20000
    const bool isOne = true;
#else
    const bool isOne = false;
#endif
    EXPECT_EQ(isOne, KORVEX_VERSION_MAJOR == 1);
}

}  // namespace korvex
