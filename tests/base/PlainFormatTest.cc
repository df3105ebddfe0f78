#include "base/PlainFormat.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

namespace {

struct Outcome {
    bool plain;
    std::string text;
};

// Formats that only a program can tell, so g++ must not look at them.
Outcome plain(const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    Outcome outcome{false, ""};
    outcome.plain = formatPlain(outcome.text, fmt, ap);
    va_end(ap);
    return outcome;
}

std::string byPrintf(const char* fmt, ...) {
    char text[4096];
    va_list ap;
    va_start(ap, fmt);
    const int size = std::vsnprintf(text, sizeof text, fmt, ap);
    va_end(ap);
    return std::string(text, static_cast<std::size_t>(size));
}

#define EXPECT_AS_PRINTF(...)                           \
    do {                                                \
        const Outcome outcome = plain(__VA_ARGS__);     \
        EXPECT_TRUE(outcome.plain);                     \
        EXPECT_EQ(outcome.text, byPrintf(__VA_ARGS__)); \
    } while (false)

#define EXPECT_NOT_PLAIN(...)                       \
    do {                                            \
        const Outcome outcome = plain(__VA_ARGS__); \
        EXPECT_FALSE(outcome.plain);                \
        EXPECT_EQ(outcome.text, "");                \
    } while (false)

TEST(PlainFormatTest, EachConversionAtItsLimits) {
    EXPECT_AS_PRINTF("%d %d %d %i", INT_MIN, INT_MAX, 0, -1);
    EXPECT_AS_PRINTF("%u %u %x %x", 0U, UINT_MAX, 0xabcdef90U, UINT_MAX);
    EXPECT_AS_PRINTF("%ld %ld %lu", LONG_MIN, LONG_MAX, ULONG_MAX);
    EXPECT_AS_PRINTF("%s|%s", "", "\xff\x80%d");
    EXPECT_AS_PRINTF("%c%c%c", 'a', 0, 0x141);
    EXPECT_AS_PRINTF("%%%%d %d%%", 5);
    EXPECT_AS_PRINTF("%s", static_cast<const char*>(nullptr));
    EXPECT_AS_PRINTF("");
    EXPECT_AS_PRINTF("no conversion");
}

TEST(PlainFormatTest, OtherFormatsAreLeftToPrintf) {
    for (const char* fmt :
         {"%5d", "%-s",  "%.3s", "%05u", "%+d", "%X",  "%o",  "%p",        "%f", "%g",
          "%hd", "%lld", "%lx",  "%lc",  "%ls", "%zu", "%jd", "%m",        "%n", "%",
          "%l",  "a%",   "%1$d", "%*d",  "% d", "%#x", "%'d", "text %d %q"}) {
        EXPECT_NOT_PLAIN(fmt, 1, 2);
    }
}

TEST(PlainFormatTest, ItEndsWhere255CharactersDo) {
    for (const unsigned size : {254U, 255U, 256U, 100000U}) {
        const std::string text(size, 'x');
        const std::string before(size - 3, 'y');
        const bool fits = size <= 255;
        EXPECT_EQ(plain("%s", text.c_str()).plain, fits) << size;
        EXPECT_EQ(plain(text.c_str()).plain, fits) << size;
        for (const char* end : {"%d", "%u", "%ld", "%lu", "%x", "%i"}) {
            EXPECT_EQ(plain((before + end).c_str(), 0x123UL % 900).plain, fits) << size << end;
        }
        EXPECT_EQ(plain((before + "yy%c").c_str(), 'z').plain, fits) << size;
        EXPECT_EQ(plain((before + "yy%%").c_str()).plain, fits) << size;
    }
}

// All arguments are of one width, so that a random format may read any of them: only on a machine
// where int, long and pointers travel alike.
TEST(PlainFormatTest, RandomFormatsAsPrintf) {
    const char* const pieces[] = {"%d", "%u", "%x", "%ld", "%lu", "%c", "%i", "%%", "word ", ": "};
    std::mt19937_64 random(1);
    const char* const scale = std::getenv("KORVEX_TEST_SCALE");
    const long rounds = 20000L * (scale != nullptr ? std::atol(scale) : 1);
    for (long i = 0; i < rounds; ++i) {
        std::string fmt;
        for (unsigned n = static_cast<unsigned>(random() % 7); n > 0; --n)
            fmt += pieces[random() % std::size(pieces)];
        unsigned long a[6];
        for (unsigned long& value : a)
            value = static_cast<unsigned long>(random() >> random() % 64);
        if (sizeof(long) == sizeof(int)) continue;
        const Outcome outcome = plain(fmt.c_str(), a[0], a[1], a[2], a[3], a[4], a[5]);
        ASSERT_TRUE(outcome.plain) << fmt;
        ASSERT_EQ(outcome.text, byPrintf(fmt.c_str(), a[0], a[1], a[2], a[3], a[4], a[5])) << fmt;
    }
}

}  // namespace
