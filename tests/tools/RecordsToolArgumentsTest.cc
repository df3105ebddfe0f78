#include "support/Terminal.h"
#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;

class ArgumentsTest : public RecordsToolTest {
  protected:
    ArgumentsTest() { writeFile(data, fileOf({{"a", "1"}})); }
};

TEST_F(ArgumentsTest, AnEmptyFileNameIsNotTheStoresOwnFile) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"-f", "", "put", "a", "2"},
                                               {"--file=", "put", "a", "2"},
                                               {"-f", "", "remove", "a"},
                                               {"-f", "", "list"}}) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "korvex-records: --file: a file's name must not be empty\n");
    }
    EXPECT_EQ(run({"put", "-i", "", "a"}).status, 2);
    EXPECT_EQ(run({"put", "-i", "", "a"}).err,
              "korvex-records: --input: a file's name must not be empty\n");
    EXPECT_EQ(stored(), fileOf({{"a", "1"}}));
}

TEST_F(ArgumentsTest, AMinusSignIsStandardInputUnlessItIsTheValuesText) {
    EXPECT_EQ(run({"put", "k", "-"}, "in\n").status, 0);
    EXPECT_EQ(run({"get", "k"}).out, "in\n");
    EXPECT_EQ(run({"put", "--", "k", "-"}, "again").status, 0);
    EXPECT_EQ(run({"get", "k"}).out, "again");
    EXPECT_EQ(run({"put", "-i", "-", "k"}, "input").status, 0);
    EXPECT_EQ(run({"get", "k"}).out, "input");
    for (const std::string& value : {"-"s, ""s, "--help"s, "-x"s}) {
        EXPECT_EQ(run({"put", "--value", value, "k"}, "unread").status, 0);
        EXPECT_EQ(run({"get", "k"}).out, value);
        EXPECT_EQ(run({"put", "k", "--value=" + value}).status, 0);
    }
}

TEST_F(ArgumentsTest, AValueComesOneWay) {
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"put", "k"},
                                               {"put", "--value", "v", "k", "v"},
                                               {"put", "-i", data, "--value", "v", "k"},
                                               {"put", "-i", data, "k", "v"}}) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err,
                  "korvex-records: put: KEY VALUE, KEY -, --value TEXT KEY, or -i FILE KEY\n");
    }
}

TEST_F(ArgumentsTest, AKeyCanBeGivenAsListShowsIt) {
    const std::string key = "a\n\\b\xff";
    EXPECT_EQ(run({"put", "--key-escaped", "a\\0a\\\\b\\ff", "v"}).status, 0);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {key, "v"}}));
    EXPECT_EQ(run({"list", "--key-escaped", "a\\0a"}).out, "a\\0a\\\\b\\ff\n");
    EXPECT_EQ(run({"get", "--key-escaped", "a\\0a\\\\b\\ff"}).out, "v");
    EXPECT_EQ(run({"stats", "--key-escaped", "a\\0a"}).status, 0);
    EXPECT_EQ(run({"dump", "-p", "--key-escaped", "a\\0a"}).status, 0);
    EXPECT_EQ(run({"get", "--key-escaped", "a\\0"}).err,
              "korvex-records: \"a\\\\0\": a backslash without two hex digits\n");
    EXPECT_EQ(run({"get", "--key-escaped", "a\\0"}).status, 2);
    EXPECT_EQ(run({"put", "--key-escaped", "a\\00", "v"}).status, 2) << "it would hold a NUL";
    EXPECT_EQ(run({"remove", "--key-escaped", "a\\0a\\\\b\\ff"}).status, 0);
    EXPECT_EQ(stored(), fileOf({{"a", "1"}}));
}

TEST_F(ArgumentsTest, AKeyGivenTwiceToRemoveCountsOnce) {
    const ChildResult result = run({"remove", "a", "none", "a", "none"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.err, "korvex-records: none: no such key\n");
    EXPECT_EQ(stored(), fileOf({}));
    EXPECT_EQ(run({"put", "a", "1"}).status, 0);
    EXPECT_EQ(run({"remove", "a", "a"}).status, 0);
}

TEST_F(ArgumentsTest, WaitingTakesANumberOfSeconds) {
    for (const char* text : {"", "x", "1x", "-1", "1.5", "99999999999"}) {
        const ChildResult result = run({"--wait", text, "remove", "a"});
        EXPECT_EQ(result.status, 2) << text;
        EXPECT_EQ(result.err,
                  "korvex-records: --wait: not a number of seconds: \""s + text + "\"\n");
    }
}

TEST_F(ArgumentsTest, AMessageMovesNoCursorWhateverTheNamesInIt) {
    const std::string red = "\x1b[31m\n\xC2\x9B\xC3\xBC";
    EXPECT_EQ(run({"-f", dir.file(red), "list"}).err,
              "korvex-records: " + dir.file("\\1b[31m\\0a\\c2\\9b\xC3\xBC: no such file\n"));
    EXPECT_EQ(run({"--" + red, "list"}).err,
              "korvex-records: --\\1b[31m\\0a\\c2\\9b\xC3\xBC: unknown option\n");
    EXPECT_EQ(run({"help", "\x1b[31m"}).err,
              "korvex-records: \\1b[31m: unknown verb; see --help\n");
}

TEST_F(ArgumentsTest, OneOfAThingIsSaidSo) {
    EXPECT_EQ(run({"check"}).out, data + ": whole, version \"2.0\", 1 record, 41 bytes\n");
    EXPECT_THAT(run({"stats"}).out, HasSubstr("1 record\n"));
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_THAT(run({"check"}).out, HasSubstr(", 2 records, "));
}

class KeysOnTerminalTest : public ArgumentsTest {
  protected:
    KeysOnTerminalTest() {
        writeFile(data, fileOf({{"bidi\xE2\x80\xAEx", "1"},
                                {"bell\7", "2"},
                                {"gr\xC3\xBC\xC3\x9F\\e", "3"},
                                {"half\xC3", "4"},
                                {"\xE6\x97\xA5\xE6\x9C\xAC", "5"}}));
    }
    std::string shown(const std::vector<std::string>& arguments, const char* locale,
                      int fd = STDOUT_FILENO) const {
        Terminal terminal(50);
        run(arguments, "", [&] {
            setenv("LC_ALL", locale, 1);
            terminal.becomes(fd);
        });
        return terminal.shown();
    }

    const std::string escapedList =
        "bell\\07\nbidi\\e2\\80\\aex\ngr\\c3\\bc\\c3\\9f\\\\e\nhalf\\c3\n\\e6\\97\\a5\\e6\\9c\\ac"
        "\n";
};

TEST_F(KeysOnTerminalTest, Utf8IsShownAsItIsWhereItCanBePrinted) {
    EXPECT_EQ(shown({"list"}, "C.UTF-8"),
              "bell\\07\nbidi\\e2\\80\\aex\ngr\xC3\xBC\xC3\x9F\\\\e\nhalf\\c3\n"
              "\xE6\x97\xA5\xE6\x9C\xAC\n");
    EXPECT_EQ(shown({"get", "\xC3\xBC"}, "C.UTF-8", STDERR_FILENO),
              "korvex-records: \xC3\xBC: no such key\n");
}

TEST_F(KeysOnTerminalTest, OtherTerminalsAndPipesGetItEscaped) {
    EXPECT_EQ(shown({"list"}, "C"), escapedList);
    EXPECT_EQ(run({"list"}, "", [] { setenv("LC_ALL", "C.UTF-8", 1); }).out, escapedList);
    EXPECT_EQ(shown({"get", "\xC3\xBC"}, "C", STDERR_FILENO),
              "korvex-records: \\c3\\bc: no such key\n");
}

TEST_F(KeysOnTerminalTest, ColumnsAreAlignedByWhatATerminalShows) {
    writeFile(data, fileOf({{"ab", "1"}, {"\xC3\xBC", "2"}, {"\xE6\x97\xA5", "3"}}));
    EXPECT_EQ(shown({"list", "-l"}, "C.UTF-8"),
              "      SIZE  KEY  VALUE\n"
              "         1  ab  1\n"
              "         1  \xC3\xBC   2\n"
              "         1  \xE6\x97\xA5  3\n");
}

}  // namespace
