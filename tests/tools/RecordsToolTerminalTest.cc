#include "support/Terminal.h"
#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;

class RecordsOnTerminalTest : public RecordsToolTest {
  protected:
    // What a terminal of that width shows as the tool's standard output.
    std::string shown(const std::vector<std::string>& arguments,
                      unsigned short columns = 60) const {
        Terminal terminal(columns);
        run(arguments, "", [&] { terminal.becomes(STDOUT_FILENO); });
        return terminal.shown();
    }
};

TEST_F(RecordsOnTerminalTest, ABinaryValueIsAHexDumpOnATerminalAndRawElsewhere) {
    const std::string value = "\0\1\2 bell \7 and more\xff"s;
    writeFile(data, fileOf({{"k", value}}));
    EXPECT_EQ(shown({"get", "k"}),
              "00000000  00 01 02 20 62 65 6c 6c  20 07 20 61 6e 64 20 6d  |... bell . and m|\n"
              "00000010  6f 72 65 ff                                       |ore.|\n");
    EXPECT_EQ(run({"get", "k"}).out, value);
}

TEST_F(RecordsOnTerminalTest, TextIsShownAsItIs) {
    writeFile(data, fileOf({{"k", "two\n\tlines, gr\xC3\xBC\xC3\x9F"}, {"empty", ""}}));
    EXPECT_EQ(shown({"get", "k"}), "two\n\tlines, gr\xC3\xBC\xC3\x9F");
    EXPECT_EQ(shown({"get", "empty"}), "");
}

TEST_F(RecordsOnTerminalTest, HexDigitsThatWereAskedForStayHexDigits) {
    writeFile(data, fileOf({{"k", "\0\xff"s}}));
    EXPECT_EQ(shown({"get", "--hex", "k"}), "00ff\n");
}

TEST_F(RecordsOnTerminalTest, TheLongListHasAlignedColumnsAndValuesThatFitTheLine) {
    writeFile(data, fileOf({{"a", "0123456789012345678901234567890123456789"},
                            {"fruit/apple", "red"},
                            {"nul\n", "\0\n"s},
                            {"nothing", ""}}));
    EXPECT_EQ(shown({"list", "--long"}, 50),
              "      SIZE  KEY          VALUE\n"
              "        40  a            0123456789012345678901...\n"
              "         3  fruit/apple  red\n"
              "         0  nothing\n"
              "         2  nul\\0a       \\00\\0a\n");
}

TEST_F(RecordsOnTerminalTest, AValueThatJustFitsIsWhole) {
    writeFile(data, fileOf({{"key", "0123456789"}}));
    EXPECT_EQ(shown({"list", "--long"}, 27),
              "      SIZE  KEY  VALUE\n        10  key  0123456789\n");
    EXPECT_EQ(shown({"list", "--long"}, 26),
              "      SIZE  KEY  VALUE\n        10  key  012345...\n");
}

TEST_F(RecordsOnTerminalTest, ALongKeyPushesItsOwnValueOnly) {
    const std::string longKey(50, 'k');
    writeFile(data, fileOf({{"a", "1"}, {longKey, "2"}}));
    EXPECT_EQ(shown({"list", "--long"}, 80), "      SIZE  KEY" + std::string(39, ' ') +
                                                 "VALUE\n         1  a" + std::string(41, ' ') +
                                                 "1\n         1  " + longKey + "  2\n");
}

TEST_F(RecordsOnTerminalTest, ANarrowTerminalShowsTheBeginningOfAValueAllTheSame) {
    writeFile(data, fileOf({{"key", "0123456789"}}));
    EXPECT_EQ(shown({"list", "--long"}, 1), "      SIZE  KEY  VALUE\n        10  key  01234...\n");
}

TEST_F(RecordsOnTerminalTest, ElsewhereTheLongListHasSizesAndKeysOnly) {
    writeFile(data, fileOf({{"a", "1"}, {"fruit/apple", "red"}}));
    EXPECT_EQ(run({"list", "--long"}).out, "         1  a\n         3  fruit/apple\n");
    EXPECT_EQ(shown({"list"}), "a\nfruit/apple\n");
    EXPECT_EQ(shown({"list", "-l0"}), "         1  a\0         3  fruit/apple\0"s);
}

TEST_F(RecordsOnTerminalTest, AListOfNothingShowsNothing) {
    writeFile(data, fileOf({}));
    EXPECT_EQ(shown({"list", "--long"}), "");
}

}  // namespace
