#include <gmock/gmock.h>

#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using namespace std::string_literals;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testsupport::LogcheckToolTest;

using LogcheckBytesTest = LogcheckToolTest;

std::string withCarriageReturns(const std::string& text) {
    std::string all;
    for (const char c : text)
        all += c == '\n' ? "\r\n" : std::string(1, c);
    return all;
}

TEST_F(LogcheckBytesTest, CarriageReturnsAreToldOnceForTheFile) {
    EXPECT_THAT(findings("\n" + withCarriageReturns(good + "appender.A.layout=SimpleLayout\n")),
                ElementsAre("2:20: error: 3 lines of the file, from this one on, end as on "
                            "Windows: the carriage return becomes part of the last word, number "
                            "or file name [bytes.crlf]"));
    EXPECT_THAT(findings("rootCategory=INFO\r\n"),
                ElementsAre("1:18: error: 1 line of the file, from this one on, ends as on "
                            "Windows: the carriage return becomes part of the last word, number "
                            "or file name [bytes.crlf]"));
    // The others are told as if the lines ended well.
    EXPECT_THAT(codes(withCarriageReturns(good + "category.x=debug\n")),
                ElementsAre("bytes.crlf", "level.case"));
    EXPECT_EQ(fixed(withCarriageReturns(good + "category.x=debug\n# end\n\n") + "a\rb\r"),
              good + "category.x=DEBUG\n# end\n\na\rb\r");
}

TEST_F(LogcheckBytesTest, TheReportShowsWhatCarriageReturnsDo) {
    EXPECT_THAT(check(withCarriageReturns(good)).out,
                testing::AllOf(HasSubstr("file    /a.log\\x0d\n"), HasSubstr("used by nobody\n")));
}

TEST_F(LogcheckBytesTest, AByteOrderMark) {
    EXPECT_THAT(findings("\xEF\xBB\xBF" + good),
                ElementsAre("1:1: error: the file begins with a byte order mark, which becomes "
                            "part of the first line: it means nothing then [bytes.mark]"));
    EXPECT_EQ(fixed("\xEF\xBB\xBF" + good), good);
    EXPECT_THAT(codes("# \xEF\xBB\xBF\n" + good), IsEmpty());
}

TEST_F(LogcheckBytesTest, Utf16IsToldAndNothingElse) {
    EXPECT_THAT(findings("\xFF\xFEr\0o\0o\0t\0=\0\n\0"s),
                ElementsAre("1:1: error: the file is UTF-16, of which nothing is understood; save "
                            "it as UTF-8 [bytes.utf16]"));
    EXPECT_THAT(codes("\xFE\xFF\0r\0="s), ElementsAre("bytes.utf16"));
}

TEST_F(LogcheckBytesTest, ANulByteJoinsLines) {
    EXPECT_THAT(findings("rootCategory=INFO\0, A\n\n# joined\nx=\0\n"s),
                ElementsAre("1:18: error: a NUL byte (the first of 2): the rest of the line is "
                            "lost, and the next line is joined to this one [bytes.nul]",
                            "3:1: error: Parse error at \"x=\": lines are rootCategory=..., "
                            "category.NAME=..., appender.NAME=... and appender.NAME.ATTRIBUTE=... "
                            "[key.unknown]"));
}

TEST_F(LogcheckBytesTest, ControlCharactersAndBrokenUtf8) {
    EXPECT_THAT(findings("category.n\x01\x02=INFO\ncategory.m\xFC=INFO\n# \x01 \xFC\n"
                         "category.\xC3\xBC=INFO\n"),
                ElementsAre("1:11: warning: a control character, \\x01: it is used as it stands "
                            "[bytes.control]",
                            "2:11: warning: \\xfc is no UTF-8; it is used, and written to the log, "
                            "as it stands [bytes.utf8]"));
}

TEST_F(LogcheckBytesTest, ACommentWithoutAnEnd) {
    EXPECT_THAT(findings(good + "\ncategory.x=INFO <!-- a\nb\n"),
                ElementsAre("4:17: error: Unterminated XML comment started: the rest of the file "
                            "is not read [comment.open]"));
}

// C0 and C1, what turns the direction of writing, what is not seen, and bytes that are no UTF-8:
// cut, overlong, surrogates, beyond Unicode.
TEST_F(LogcheckBytesTest, NothingThatATerminalObeysReachesIt) {
    const std::vector<std::string> bad = {
        "\x1b]0;",      "\x9b"s,        "\xC2\x9b",         "\xE2\x80\xAE",
        "\xE2\x81\xA6", "\xEF\xBB\xBF", "\xC2\xA0",         "\x7f",
        "\xC0\xAF",     "\xE0\x80\xAF", "\xED\xA0\x80",     "\xF4\x90\x80\x80",
        "\xE2\x82",     "\xFF",         "\xF0\x8F\xBF\xBF", "\xD8\x9C",
        "\xE2\x80\x89", "\xE3\x80\x80", "\xEF\xB8\x8F",     "\xF3\xA0\x81\x81"};
    for (const std::string& bytes : bad) {
        const std::string text = "category.a" + bytes + "=INFO," + bytes + "\nappender.a" + bytes +
                                 ".fileName=/a" + bytes + "\nx" + bytes + "\n" + pattern + bytes +
                                 "%m%n\n";
        for (const std::vector<std::string>& arguments :
             std::vector<std::vector<std::string>>{{}, {"--json"}, {"--channel", "a" + bytes}}) {
            const std::string out = check(text, arguments).out;
            EXPECT_THAT(out, Not(HasSubstr(bytes)));
            for (const char c : out) {
                const auto byte = static_cast<unsigned char>(c);
                EXPECT_TRUE(byte == '\n' || (byte >= 0x20 && byte < 0x7f)) << int{byte};
            }
        }
    }
    EXPECT_THAT(check("category.\xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80=INFO\n").out,
                HasSubstr("category \xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80\n"));
}

TEST_F(LogcheckBytesTest, PlacesCountBytesAndFollowTheLibrarysLines) {
    EXPECT_THAT(codes("<!-- a\nb --> x\n"), ElementsAre("key.unknown"));
    EXPECT_THAT(findings("<!-- a\nb --> x\n"), ElementsAre(testing::StartsWith("2:7: error: ")));
    EXPECT_THAT(findings("category.\xC3\xBC=INFO, B\n"),
                ElementsAre(testing::StartsWith("1:19: error: ")));
    EXPECT_THAT(findings("category.net=<!--\n-->INFO, B\n"),
                ElementsAre(testing::StartsWith("2:10: error: ")));
    EXPECT_THAT(findings("xyz<!--\n-->\n"), ElementsAre(testing::StartsWith("2:1: error: ")));
}

}  // namespace
