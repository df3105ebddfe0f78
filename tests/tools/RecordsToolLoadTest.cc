#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;
using testing::IsEmpty;

class LoadTest : public RecordsToolTest {
  protected:
    LoadTest() { writeFile(data, before); }

    void expectRefused(const std::string& text, const std::string& why,
                       const std::vector<std::string>& arguments = {"load"}) const {
        const ChildResult result = run(arguments, text);
        EXPECT_EQ(result.status, 2) << text;
        EXPECT_EQ(result.err, "korvex-records: dump, " + why + "\n");
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(stored(), before);
    }
    std::string loaded(const std::vector<std::string>& arguments, const std::string& text) const {
        writeFile(data, before);
        const ChildResult result = run(arguments, text);
        EXPECT_EQ(result.status, 0) << result.err;
        return result.out;
    }

    const std::string before = fileOf({{"a", "1"}, {"b", "2"}, {"c", "3"}});
    const std::string head = "VERSION=3\nformat=print\ntype=btree\nHEADER=END\n";
    const std::string dump = head + " b\n 22\n c\n 3\n d\n 4\nDATA=END\n";
};

TEST_F(LoadTest, ItSaysHowManyRecordsWereAddedChangedAndRemoved) {
    EXPECT_EQ(loaded({"load"}, dump), "1 record added, 1 changed, 0 removed\n");
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {"b", "22"}, {"c", "3"}, {"d", "4"}}));
    EXPECT_EQ(run({"load"}, dump).out, "0 records added, 0 changed, 0 removed\n");
}

TEST_F(LoadTest, ReplacingLeavesJustWhatTheDumpHolds) {
    EXPECT_EQ(loaded({"load", "--replace"}, dump), "1 record added, 1 changed, 1 removed\n");
    EXPECT_EQ(stored(), fileOf({{"b", "22"}, {"c", "3"}, {"d", "4"}}));
    EXPECT_EQ(loaded({"load", "--replace"}, head + "DATA=END\n"),
              "0 records added, 0 changed, 3 removed\n");
    EXPECT_EQ(stored(), fileOf({}));
}

TEST_F(LoadTest, KeepingLeavesTheKeysThatAreThere) {
    EXPECT_EQ(loaded({"load", "--keep"}, dump), "1 record added, 0 changed, 0 removed\n");
    EXPECT_EQ(stored(), fileOf({{"a", "1"}, {"b", "2"}, {"c", "3"}, {"d", "4"}}));
    EXPECT_EQ(run({"load", "--keep", "--replace"}, dump).status, 2);
}

TEST_F(LoadTest, ADryRunOnlySays) {
    EXPECT_EQ(loaded({"load", "--dry-run"}, dump),
              "1 record would be added, 1 changed, 0 removed\n");
    EXPECT_EQ(loaded({"load", "--dry-run", "--replace"}, dump),
              "1 record would be added, 1 changed, 1 removed\n");
    EXPECT_EQ(stored(), before);
    const ChildResult result = run({"-f", dir.file("none"), "load", "--dry-run"}, dump);
    EXPECT_EQ(result.out, "3 records would be added, 0 changed, 0 removed\n");
    EXPECT_FALSE(std::filesystem::exists(dir.file("none")));
}

TEST_F(LoadTest, AHalfLoadedDumpChangesNothing) {
    expectRefused(head + " x\n 1\n y\n", "line 8: the dump ends without its last line, DATA=END");
    expectRefused(head + " x\n 1\n", "line 7: the dump ends without its last line, DATA=END");
    expectRefused(head + " x\n 1\n y\n 2\nbad\n 3\nDATA=END\n",
                  "line 9: no blank at the start of a record's line");
    for (const char* how : {"--replace", "--keep", "--dry-run"})
        expectRefused(head + " x\n 1\n", "line 7: the dump ends without its last line, DATA=END",
                      {"load", how});
}

TEST_F(LoadTest, ADumpIsOneDatabaseFromItsFirstLineToItsLast) {
    expectRefused(dump + dump, "line 12: several databases in one dump");
    expectRefused(dump + "x\n", "line 12: something behind DATA=END");
    expectRefused(dump + "\n", "line 12: something behind DATA=END");
}

TEST_F(LoadTest, AKeyThatComesTwiceIsRefused) {
    const std::string twice = " x\n 1\n x\n 2\nDATA=END\n";
    expectRefused("VERSION=3\nformat=print\nduplicates=1\nHEADER=END\n" + twice,
                  "line 7: key \"x\" comes twice, as duplicates=1 says; a record file holds a key "
                  "once");
    expectRefused(head + twice, "line 7: key \"x\" comes twice");
    expectRefused(head + " y\n 1\n x\n 2\n y\n 1\nDATA=END\n", "line 9: key \"y\" comes twice");
    EXPECT_EQ(loaded({"load"},
                     "VERSION=3\nformat=print\nduplicates=1\nHEADER=END\n x\n 1\n"
                     "DATA=END\n"),
              "1 record added, 0 changed, 0 removed\n");
}

// Its beginning is read again where the order breaks.
TEST_F(LoadTest, ADumpNeedNotBeInOrder) {
    const std::string some = head + " m\n M\n q\n Q\n c\n C\n x\n X\n d\n D\n";
    const std::string lines =
        "{\"key\":\"m\",\"value\":\"M\"}\n{\"key\":\"q\",\"value\":\"Q\"}\n"
        "{\"key\":\"c\",\"value\":\"C\"}\n{\"key\":\"x\",\"value\":\"X\"}\n"
        "{\"key\":\"d\",\"value\":\"D\"}\n";
    const std::string all = fileOf({{"c", "C"}, {"d", "D"}, {"m", "M"}, {"q", "Q"}, {"x", "X"}});
    const std::string told = "4 records added, 1 changed, 2 removed\n";
    EXPECT_EQ(loaded({"load", "--replace"}, some + "DATA=END\n"), told);
    EXPECT_EQ(stored(), all);
    EXPECT_EQ(loaded({"load", "--replace", "--json"}, lines), told);
    EXPECT_EQ(stored(), all);
    writeFile(data, before);
    for (const std::string key : {"m", "q", "c", "x", "d"}) {
        expectRefused(some + " " + key + "\n 1\nDATA=END\n",
                      "line 15: key \"" + key + "\" comes twice");
        expectRefused(lines + "{\"key\":\"" + key + "\",\"value\":\"1\"}\n",
                      "line 6: key \"" + key + "\" comes twice", {"load", "--json"});
    }
}

TEST_F(LoadTest, RecordsWithoutKeysAndUnknownFormatsAreRefused) {
    expectRefused("VERSION=3\ntype=recno\nHEADER=END\n 61\nDATA=END\n",
                  "line 3: a dump without keys");
    expectRefused("VERSION=3\ntype=queue\nHEADER=END\n 61\nDATA=END\n",
                  "line 3: a dump without keys");
    expectRefused("VERSION=3\nkeys=0\nHEADER=END\nDATA=END\n", "line 3: a dump without keys");
    expectRefused("VERSION=3\ntype=heap\nHEADER=END\nDATA=END\n", "line 2: unknown type=heap");
    expectRefused("VERSION=3\nformat=x\nHEADER=END\nDATA=END\n", "line 2: unknown format=x");
    expectRefused("VERSION=2\nHEADER=END\nDATA=END\n", "line 1: no VERSION=3");
    EXPECT_EQ(loaded({"load"}, "VERSION=3\nkeys=1\ntype=recno\nHEADER=END\n 31\n 61\nDATA=END\n"),
              "1 record added, 0 changed, 0 removed\n");
    EXPECT_EQ(run({"get", "1"}).out, "a");
}

TEST_F(LoadTest, RefusedKeysAreNamedWithTheirLines) {
    expectRefused(head + " x\n 1\n _Record-File-Version!\n 2\nDATA=END\n",
                  "line 7: refused key \"_Record-File-Version!\": it would not survive a reload");
    expectRefused(head + " x\\00y\n 1\nDATA=END\n",
                  "line 5: refused key \"x\\00y\": it would not survive a reload");
}

TEST_F(LoadTest, ABackslashIsDumpedAsHexDigitsAndBothFormsAreRead) {
    writeFile(data, fileOf({{"a\\b", "\\"}}));
    EXPECT_EQ(run({"dump", "-p"}).out, head + " a\\5cb\n \\5c\nDATA=END\n");
    writeFile(data, before);
    EXPECT_EQ(run({"load", "--replace"}, head + " a\\\\b\n \\5c\nDATA=END\n").status, 0);
    EXPECT_EQ(stored(), fileOf({{"a\\b", "\\"}}));
}

TEST_F(LoadTest, JsonReadsBackExactly) {
    std::string all;
    for (int c = 0; c < 256; ++c)
        all += static_cast<char>(c);
    const std::string any =
        fileOf({{"", "\xff"},
                {"\x01\"\\/\b\t\n", all},
                {"gr\xC3\xBC\xC3\x9F \xF0\x9F\x98\x80", "\x7f\xC2\x80\xC2\x9F\xC2\xA0"},
                {"nul", "a\0b"s},
                {"\xff", ""}});
    writeFile(data, any);
    const std::string json = run({"dump", "--json"}).out;
    EXPECT_EQ(json.substr(0, json.find('\n')), "{\"key\":\"\",\"value_base64\":\"/w==\"}");
    EXPECT_THAT(json,
                HasSubstr("\n{\"key\":\"\\u0001\\\"\\\\/\\u0008\\t\\n\",\"value_base64\":\"AAEC"));
    EXPECT_THAT(json,
                HasSubstr("\n{\"key\":\"gr\xC3\xBC\xC3\x9F "
                          "\xF0\x9F\x98\x80\",\"value\":\"\\u007f\\u0080\\u009f\xC2\xA0\"}\n"));
    EXPECT_THAT(json, HasSubstr("\n{\"key\":\"nul\",\"value\":\"a\\u0000b\"}\n"));
    EXPECT_THAT(json, HasSubstr("\n{\"key_base64\":\"/w==\",\"value\":\"\"}\n"));
    EXPECT_EQ(loaded({"load", "--json", "--replace"}, json),
              "5 records added, 0 changed, 3 removed\n");
    EXPECT_EQ(stored(), any);
}

TEST_F(LoadTest, JsonOfOthersIsReadAsItIsMeant) {
    EXPECT_EQ(loaded({"load", "--json", "--replace"},
                     " { \"value\" : \"\\u00e9\\ud83d\\ude00\\/\" , \"key\" : \"x\" } \r\n"),
              "1 record added, 0 changed, 3 removed\n");
    EXPECT_EQ(run({"get", "x"}).out, "\xC3\xA9\xF0\x9F\x98\x80/");
}

TEST_F(LoadTest, BadJsonIsRefusedWithItsLine) {
    const std::string good = "{\"key\":\"x\",\"value\":\"1\"}\n";
    const std::pair<std::string, std::string> all[] = {
        {"{\"key\":\"y\",\"value\":\"1\"}", "it is cut: no newline at its end"},
        {"{\"key\":\"y\",\"val\n", "an open string"},
        {"{\"key\":\"y\"}\n", "no key and value"},
        {"{\"key\":\"y\",\"key_base64\":\"eQ==\",\"value\":\"\"}\n", "\"key\" comes twice"},
        {"{\"key\":\"y\",\"value\":\"1\",\"more\":\"\"}\n", "unknown name \"more\""},
        {"{\"key\":\"y\",\"value\":1}\n", "no string"},
        {"{\"key\":\"y\",\"value\":\"1\"} {}\n", "something behind the object"},
        {"{\"key\":\"y\",\"value_base64\":\"A\"}\n", "no base 64"},
        {"{\"key\":\"y\",\"value_base64\":\"AB==\"}\n", "no base 64"},
        {"{\"key\":\"y\",\"value\":\"\xff\"}\n", "bytes that are not UTF-8"},
        {"{\"key\":\"y\",\"value\":\"\t\"}\n", "a control character in a string"},
        {"{\"key\":\"y\",\"value\":\"\\ud83d\"}\n", "half a surrogate pair"},
        {"{\"key\":\"y\",\"value\":\"\\x\"}\n", "an unknown escape"},
        {"{\"key\":\"x\",\"value\":\"2\"}\n", "key \"x\" comes twice"},
        {"{\"key\":\"a\\u0000\",\"value\":\"2\"}\n",
         "refused key \"a\\00\": it would not survive a reload"},
        {"[]\n", "no {"},
        {"\n", "no {"}};
    for (const auto& [line, why] : all)
        expectRefused(good + line, "line 2: " + why, {"load", "--json"});
    EXPECT_EQ(run({"dump", "--json", "--print"}).status, 2);
}

class BatchTest : public LoadTest {
  protected:
    void expectBad(const std::string& lines, int status, const std::string& why) const {
        const ChildResult result = run({"batch"}, lines);
        EXPECT_EQ(result.status, status) << lines;
        EXPECT_EQ(result.err, "korvex-records: batch, " + why + "\n");
        EXPECT_EQ(stored(), before);
    }
};

TEST_F(BatchTest, PutsAndRemovesAreDoneInOrder) {
    writeFile(dir.file("lines"),
              "# comment\n\nput\tb\t22\nremove\ta\nput\ta\\09\\\\\t\\00\xC3\xBC x\nput\tz\t\n"
              "remove\tz\nput\tz\tlast\n");
    const ChildResult result = run({"batch", dir.file("lines")});
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.out, "3 records added, 1 changed, 2 removed\n");
    EXPECT_EQ(stored(),
              fileOf({{"a\t\\", "\0\xC3\xBC x"s}, {"b", "22"}, {"c", "3"}, {"z", "last"}}));
}

TEST_F(BatchTest, AllIsDoneOrNothing) {
    expectBad("put\tx\t1\nremove\tnone\nput\ty\t2\n", 1,
              "line 2: none: no such key; nothing is changed");
    expectBad("put\tx\t1\nput\ty\n", 2, "line 2: not put, KEY and VALUE, parted by tabs");
    expectBad("remove\ta\tb\n", 2, "line 1: not remove and KEY, parted by a tab");
    expectBad("put\tx\t1\nset\ty\t2\n", 2, "line 2: neither \"put\" nor \"remove\" before a tab");
    expectBad("put x 1\n", 2, "line 1: neither \"put\" nor \"remove\" before a tab");
    expectBad("put\tx\t1\nput\ty\t2", 2, "line 2: it is cut: no newline at its end");
    expectBad("put\tx\\q\t1\n", 2, "line 1: a backslash without two hex digits");
    expectBad("put\tx\t1\r\n", 2,
              "line 1: a control character; write it as a backslash and two hex digits");
    expectBad("put\t_record-file-version\t1\n", 2,
              "line 1: refused key \"_record-file-version\": it would not survive a reload");
}

TEST_F(BatchTest, AMissingFileIsMadeAndNothingToDoIsNoChange) {
    EXPECT_EQ(run({"-f", dir.file("new"), "batch"}, "put\tx\t1\n").status, 0);
    EXPECT_EQ(readFile(dir.file("new")), fileOf({{"x", "1"}}));
    const auto time = std::filesystem::last_write_time(data);
    EXPECT_EQ(run({"batch"}, "").out, "0 records added, 0 changed, 0 removed\n");
    EXPECT_EQ(std::filesystem::last_write_time(data), time);
}

TEST_F(BatchTest, ThereIsOneSaveWhateverTheNumberOfLines) {
    writeFile(dir.file("home/etc/log-cmdline.cfg"),
              "rootCategory=DEBUG,A\nappender.A.fileName=${KORVEX_HOME}/log\n");
    EXPECT_EQ(run({"batch"}, "put\tx\t1\nput\ty\t2\nremove\ta\nremove\tb\n").status, 0);
    EXPECT_EQ(readFile(dir.file("home/log")), "Writing record file to disk.\n");
    std::filesystem::remove(dir.file("home/log"));
    EXPECT_EQ(run({"remove", "x", "y", "c"}).status, 0);
    EXPECT_EQ(readFile(dir.file("home/log")), "Writing record file to disk.\n");
    EXPECT_EQ(stored(), fileOf({}));
}

TEST_F(BatchTest, WhatAPipeBringsIsReadLikeAFile) {
    if (isEmulated()) GTEST_SKIP() << "the shell knows no emulator";
    std::string lines;
    for (int i = 1000; i < 5000; ++i)
        lines += "put\tkey" + std::to_string(i) + "\t" + std::string(50, 'v') + "\n";
    writeFile(dir.file("lines"), lines);
    const ChildResult result = runInChild([&] {
        setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
        setenv("KORVEX_DB", dir.file("db").c_str(), 1);
        // Without a place for temporary files, too.
        setenv("TMPDIR", dir.file("none").c_str(), 1);
        const std::string script = "cat " + dir.file("lines") + " | " KORVEX_RECORDS " batch";
        execl("/bin/sh", "sh", "-c", script.c_str(), nullptr);
        return 127;
    });
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(result.out, "4000 records added, 0 changed, 0 removed\n");
}

}  // namespace
