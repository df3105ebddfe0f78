#include <korvex/util/Logger.h>

#include <gtest/gtest.h>

#include <string>

namespace {

TEST(LogLevelTest, EveryLevelHasItsNumberNameAndLength) {
    const struct {
        LogLevel level;
        int number;
        std::string name;
    } all[] = {{DEBUG, 0, "DEBUG"}, {INFO, 1, "INFO"},   {NOTICE, 2, "NOTICE"},
               {WARN, 3, "WARN"},   {ERROR, 4, "ERROR"}, {CRIT, 5, "CRIT"},
               {ALERT, 6, "ALERT"}, {FATAL, 7, "FATAL"}, {EMERG, 8, "EMERG"}};
    for (const auto& expected : all) {
        EXPECT_EQ(static_cast<int>(expected.level), expected.number);
        unsigned long len = 0;
        EXPECT_EQ(loglevel2str(&len, expected.level), expected.name);
        EXPECT_EQ(len, expected.name.size());
    }
}

TEST(LogLevelTest, AnyOtherValueIsThreeQuestionMarks) {
    for (const int value : {-1, 9, 1000}) {
        unsigned long len = 0;
        EXPECT_STREQ(loglevel2str(&len, static_cast<LogLevel>(value)), "???") << value;
        EXPECT_EQ(len, 3U);
    }
}

TEST(ValidUintTest, DigitsWithoutALeadingZeroAreValid) {
    for (const char* s : {"0", "9", "42", "10", "99999999999999999999999"}) {
        EXPECT_TRUE(isValidUint(s)) << s;
    }
}

TEST(ValidUintTest, EverythingElseIsNot) {
    for (const char* s :
         {"", "00", "007", "4a", "a4", "-1", "+1", " 1", "1 ", "1.0", "0x1", "/", ":", "1k"}) {
        EXPECT_FALSE(isValidUint(s)) << '"' << s << '"';
    }
}

}  // namespace
