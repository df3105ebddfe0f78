#include <korvex/util/Logger.h>

#include <gtest/gtest.h>

#ifdef __GLIBC__
#include <printf.h>
#endif

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>

#include "support/Child.h"
#include "support/Faults.h"

namespace {

using testsupport::Call;
using testsupport::CountCalls;
using testsupport::FailNth;

// The runtime's way in, so that odd formats need no literal.
std::string formatted(int errnum, const char* fmt, ...) {
    std::string out = "former content";
    va_list ap;
    va_start(ap, fmt);
    Logger::vformat(out, errnum, fmt, ap);
    va_end(ap);
    return out;
}

TEST(FormatTest, PercentMIsTheTextOfTheErrorNumber) {
    EXPECT_EQ(formatted(ENOENT, "open: %m"), "open: No such file or directory");
    EXPECT_EQ(formatted(EACCES, "%m, %m!"), "Permission denied, Permission denied!");
    EXPECT_EQ(formatted(EACCES, "%s%m%d", "a", 7), "aPermission denied7");
}

TEST(FormatTest, ADoubledPercentSignBeforeMIsNoConversion) {
    EXPECT_EQ(formatted(2, "100%%m"), "100%m");
    EXPECT_EQ(formatted(2, "%%%m"), "%No such file or directory");
    EXPECT_EQ(formatted(2, "%%%%m %m"), "%%m No such file or directory");
}

TEST(FormatTest, APercentSignAtTheEndStaysWithTheErrorText) {
    // printf leaves it open what an unfinished conversion gives: glibc refuses the format.
    EXPECT_EQ(formatted(ENOENT, "%m%"), "No such file or directory%");
}

TEST(FormatTest, AnErrorNumberWithoutATextIsUnknown) {
    EXPECT_EQ(formatted(99999, "%m"), "UNKNOWN ERROR");
    EXPECT_EQ(formatted(-1, "%m"), "UNKNOWN ERROR");
}

TEST(FormatTest, AFailingErrorTextIsUnknown) {
    const FailNth fault(Call::strerror_r, 1, ERANGE);
    EXPECT_EQ(formatted(ENOENT, "%m"), "UNKNOWN ERROR");
    EXPECT_TRUE(fault.fired());
}

TEST(FormatTest, AnErrorTextWithAWidthIsTheSameErrors) {
    errno = EACCES;
    EXPECT_EQ(formatted(ENOENT, "%-30m|"), "No such file or directory     |");
}

TEST(FormatTest, TheFormerContentIsReplaced) {
    EXPECT_EQ(formatted(0, "x"), "x");
}

TEST(FormatTest, TheShortFormTakesTheCurrentErrno) {
    std::string out;
    errno = ENOENT;
    __extension__ Logger::format(out, "%m");
    EXPECT_EQ(out, "No such file or directory");
}

TEST(FormatTest, TheFormWithANumberTakesThatNumber) {
    std::string out;
    errno = ENOENT;
    __extension__ Logger::format(out, EACCES, "%d %m", 5);
    EXPECT_EQ(out, "5 Permission denied");
}

TEST(FormatTest, ErrnoStaysAsItWas) {
    std::string out;
    errno = 1234;
    __extension__ Logger::format(out, EACCES, "%m");
    EXPECT_EQ(errno, 1234);
}

TEST(FormatTest, TheResultMayBeAnArgument) {
    std::string out(300, 'x');
    const std::string expected = out + out;
    Logger::format(out, "%s%s", out.c_str(), out.c_str());
    EXPECT_EQ(out, expected);
}

TEST(FormatTest, TextsAroundTheLocalBufferComeOutWhole) {
    for (const std::size_t n : {255U, 256U, 257U, 5000U}) {
        const std::string text(n, 'y');
        EXPECT_EQ(formatted(0, "%s", text.c_str()), text);
    }
}

TEST(FormatTest, OnlyLongerTextsTouchTheHeap) {
    const std::string fits(255, 'y');
    const std::string tooLong(256, 'y');
    const CountCalls blocks(Call::new_array);
    formatted(0, "%s", fits.c_str());
    EXPECT_EQ(blocks.count(), 0U);
    formatted(0, "%s", tooLong.c_str());
    EXPECT_EQ(blocks.count(), 1U);
}

TEST(FormatTest, AConversionThatCannotSucceedShowsTheFormat) {
    const wchar_t unconvertible[] = {static_cast<wchar_t>(0x7fffffff), 0};
    EXPECT_EQ(formatted(0, "user %ls", unconvertible), "user %ls");
}

TEST(FormatTest, NulCharactersAreKept) {
    EXPECT_EQ(formatted(0, "a%cb", 0), std::string("a\0b", 3));
}

#ifdef __GLIBC__

// A conversion of our own: each of the first passes over the arguments finds a text that is longer
// than the one before, as it does where another thread lengthens it.
int printGrowing(FILE* stream, const struct printf_info*, const void* const*) {
    static std::size_t passes = 0;
    passes = std::min<std::size_t>(passes + 1, 4);
    return fprintf(stream, "%s", std::string(300 * passes, 'g').c_str());
}

int noArguments(const struct printf_info*, std::size_t, int*, int*) {
    return 0;
}

TEST(FormatTest, ATextThatGrowsBetweenThePassesIsWhole) {
    const auto result = testsupport::runInChild([] {
        register_printf_specifier('Y', printGrowing, noArguments);
        return formatted(0, "<%Y>") == "<" + std::string(1200, 'g') + ">" ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

#endif

}  // namespace
