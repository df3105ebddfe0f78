#include <gtest/gtest.h>

#include "Suggestion.h"
#include "text/Base64.h"
#include "text/Escape.h"
#include "text/Utf8.h"

namespace {

using namespace std::string_literals;

TEST(TextForms, Base64OfEachLength) {
    const std::pair<std::string, std::string> all[] = {
        {"", ""},        {"f", "Zg=="},        {"fo", "Zm8="},
        {"foo", "Zm9v"}, {"foob", "Zm9vYg=="}, {"\xff\xfe\xfd", "//79"},
        {"\0"s, "AA=="}, {"\xfb\xf0", "+/A="}};
    for (const auto& [bytes, text] : all) {
        EXPECT_EQ(toBase64(bytes), text);
        std::string back = "before";
        EXPECT_TRUE(appendBase64(back, text));
        EXPECT_EQ(back, "before" + bytes);
    }
    for (const char* bad : {"Z", "Zg", "Zg=", "Zh==", "Zm9=", "Z===", "====", "Zg==Zg==", "Zm 9"}) {
        std::string ignored;
        EXPECT_FALSE(appendBase64(ignored, bad)) << bad;
    }
}

TEST(TextForms, Utf8HasNoOverlongFormsAndNoSurrogates) {
    for (const std::string& good :
         {""s, "a\0"s, "\xC2\x80"s, "\xDF\xBF"s, "\xE0\xA0\x80"s, "\xED\x9F\xBF"s, "\xEE\x80\x80"s,
          "\xEF\xBF\xBF"s, "\xF0\x90\x80\x80"s, "\xF4\x8F\xBF\xBF"s}) {
        EXPECT_TRUE(isUtf8(good)) << escaped(good);
    }
    for (const std::string& bad :
         {"\x80"s, "\xC1\xBF"s, "\xC2"s, "\xC2\x41"s, "\xE0\x9F\xBF"s, "\xED\xA0\x80"s, "\xE1\x80"s,
          "\xF0\x8F\xBF\xBF"s, "\xF4\x90\x80\x80"s, "\xF5\x80\x80\x80"s, "\xFF"s, "a\xC3"s}) {
        EXPECT_FALSE(isUtf8(bad)) << escaped(bad);
    }
}

TEST(TextForms, Utf8ReadsBackWhatWasAppended) {
    for (const char32_t character :
         {0x0U, 0x7FU, 0x80U, 0x7FFU, 0x800U, 0xD7FFU, 0xE000U, 0xFFFFU, 0x10000U, 0x10FFFFU}) {
        std::string text;
        appendUtf8(text, character);
        char32_t back = 1;
        EXPECT_EQ(utf8Character(text, back), text.size());
        EXPECT_EQ(back, character);
    }
}

TEST(TextForms, WhatIsEscapedIsUnescaped) {
    std::string all;
    for (int c = 0; c < 256; ++c)
        all += static_cast<char>(c);
    std::string back;
    EXPECT_TRUE(appendUnescaped(back, escaped(all)));
    EXPECT_EQ(back, all);
    for (const char* bad : {"\\", "\\0", "a\\0g", "\\x"}) {
        std::string ignored;
        EXPECT_FALSE(appendUnescaped(ignored, bad)) << bad;
    }
}

TEST(TextForms, TheNearestNameIsSuggested) {
    const std::vector<std::string> names = {"list", "get", "--hex", "--help", "remove"};
    EXPECT_EQ(didYouMean("lsit", names), "; did you mean list?");
    EXPECT_EQ(didYouMean("--hepl", names), "; did you mean --help?");
    EXPECT_EQ(didYouMean("rmove", names), "; did you mean remove?");
    EXPECT_EQ(didYouMean("rmoe", names), "; did you mean remove?");
    EXPECT_EQ(didYouMean("roe", names), "") << "three are missing";
    EXPECT_EQ(didYouMean("put", names), "") << "nothing is left of it";
    EXPECT_EQ(didYouMean("", names), "");
    EXPECT_EQ(didYouMean(std::string(100, 'l'), names), "");
}

}  // namespace
