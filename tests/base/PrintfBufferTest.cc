#include "base/PrintfBuffer.h"

#include <gtest/gtest.h>

#include <string>

namespace {

// What the buffer made of a format: its text, or "refused".
__attribute__((format(printf, 1, 2))) std::string formatted(const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    const PrintfBuffer buffer(fmt, ap);
    va_end(ap);
    return buffer.ok() ? std::string(buffer.data(), buffer.size()) : "refused";
}

TEST(PrintfBufferTest, TextsAroundTheLocalSizeComeOutWhole) {
    for (const std::size_t length : {0U, 1U, 254U, 255U, 256U, 257U, 100000U}) {
        const std::string text(length, 'x');
        EXPECT_EQ(formatted("%s", text.c_str()), text) << length;
    }
}

TEST(PrintfBufferTest, AConversionThatCannotSucceedIsRefusedNotRetriedForEver) {
    const wchar_t unconvertible[] = {static_cast<wchar_t>(0x7fffffff), 0};
    EXPECT_EQ(formatted("%ls", unconvertible), "refused");
}

// What of the format came before the conversion is not left standing.
TEST(PrintfBufferTest, ARefusedTextIsEmpty) {
    const auto expectEmpty = [](const char* fmt, ...) {
        va_list ap;
        va_start(ap, fmt);
        const PrintfBuffer buffer(fmt, ap);
        va_end(ap);
        EXPECT_FALSE(buffer.ok());
        EXPECT_EQ(buffer.size(), 0U);
        EXPECT_STREQ(buffer.data(), "");
    };
    const wchar_t unconvertible[] = {static_cast<wchar_t>(0x7fffffff), 0};
    expectEmpty("before %ls", unconvertible);
}

TEST(PrintfBufferTest, NulCharactersAreKept) {
    EXPECT_EQ(formatted("a%cb", 0), std::string("a\0b", 3));
}

}  // namespace
