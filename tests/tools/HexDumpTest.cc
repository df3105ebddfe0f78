#include "korvex-records/terminal/HexDump.h"

#include <gtest/gtest.h>

namespace {

using namespace std::string_literals;

TEST(HexDumpTest, TextIsUtf8WithoutControlCharacters) {
    for (const char* text : {"", "plain ~", "two\nlines\tand a tab\n", "\xC2\xA0", "\xDF\xBF",
                             "gr\xC3\xBC\xC3\x9F", "\xE0\xA0\x80", "\xE2\x82\xAC", "\xED\x9F\xBF",
                             "\xEF\xBF\xBD", "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF"}) {
        EXPECT_TRUE(isText(text)) << text;
    }
}

TEST(HexDumpTest, WhatCouldMoveTheCursorIsNoText) {
    for (const std::string& bytes :
         {"\0"s, "a\033[2J"s, "a\rb"s, "\b"s, "\x7F"s, "\xC2\x80"s, "\xC2\x9B"s}) {
        EXPECT_FALSE(isText(bytes)) << testing::PrintToString(bytes);
    }
}

TEST(HexDumpTest, WhatIsNoUtf8IsNoText) {
    for (const char* bytes :
         {"\x80", "\xC0\x80", "\xC1\xBF", "\xC3", "\xC3z", "\xE0\x9F\xBF", "\xE2\x82", "\xE2\x82z",
          "\xED\xA0\x80", "\xF0\x8F\xBF\xBF", "\xF0\x9F\x98", "\xF4\x90\x80\x80",
          "\xF5\x80\x80\x80", "\xFF", "a\xE9"}) {
        EXPECT_FALSE(isText(bytes)) << testing::PrintToString(bytes);
    }
}

TEST(HexDumpTest, SixteenBytesStandInALine) {
    EXPECT_EQ(hexDump(""), "");
    EXPECT_EQ(hexDump("\0\x7F az~\xFF"s),
              "00000000  00 7f 20 61 7a 7e ff                              |.. az~.|\n");
    EXPECT_EQ(hexDump("0123456789abcdef"),
              "00000000  30 31 32 33 34 35 36 37  38 39 61 62 63 64 65 66  |0123456789abcdef|\n");
    EXPECT_EQ(hexDump("0123456789abcdefg"),
              "00000000  30 31 32 33 34 35 36 37  38 39 61 62 63 64 65 66  |0123456789abcdef|\n"
              "00000010  67                                                |g|\n");
}

}  // namespace
