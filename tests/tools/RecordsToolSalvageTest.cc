#include <sys/resource.h>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;
using testing::Not;

using Pairs = std::vector<std::pair<std::string, std::string>>;

class DamagedFileTest : public RecordsToolTest {
  protected:
    static std::string number(std::uint32_t n) {
        std::string bytes;
        for (unsigned i = 0; i < 4; ++i)
            bytes += static_cast<char>(n >> (8 * i) & 0xFF);
        return bytes;
    }
    // The file with other bytes from `at` on.
    static std::string with(std::string whole, std::size_t at, const std::string& bytes) {
        return whole.replace(at, bytes.size(), bytes);
    }
    // Salvages; the records of the new file.
    std::string salvaged(const std::string& damaged, const std::string& report, int status = 3) {
        writeFile(data, damaged);
        const std::string fresh = dir.file("fresh");
        std::filesystem::remove(fresh);
        const ChildResult result = run({"salvage", "-o", fresh});
        EXPECT_EQ(result.out, report);
        EXPECT_EQ(result.err, "");
        EXPECT_EQ(result.status, status);
        EXPECT_EQ(stored(), damaged) << "the damaged file is left alone";
        return readFile(fresh);
    }

    const Pairs records{{"a", "first"}, {"b", "second"}, {"c", "third"}, {"d", "fourth"}};
    const std::string file = fileOf(records);
    // Where records begin: 31 bytes of the version, then 14, 15, 14 and 15.
    const std::size_t b = 45;
    const std::size_t c = 60;
    const std::size_t d = 74;
};

TEST_F(DamagedFileTest, ReadersShowWhatStandsBeforeTheFirstFaultAndNothingBehindIt) {
    writeFile(data, with(file, c, "\xff\xff\xff\xff"));
    writeFile(dir.file("other"), fileOf({}));
    const std::string told = "korvex-records: " + data +
                             ": damaged at offset 60: key cut short: 4294967295 bytes, 25 left\n";
    const std::pair<std::vector<std::string>, std::string> all[] = {
        {{"list"}, "a\nb\n"},
        {{"get", "a"}, "first"},
        {{"dump", "-p"},
         "VERSION=3\nformat=print\ntype=btree\nHEADER=END\n a\n first\n b\n second\n"},
        {{"dump", "--json"},
         "{\"key\":\"a\",\"value\":\"first\"}\n{\"key\":\"b\",\"value\":\"second\"}\n{\"damaged\":"
         "\"" +
             data + ": damaged at offset 60: key cut short: 4294967295 bytes, 25 left\"}\n"},
        {{"diff", dir.file("other")}, "- a\n- b\n"}};
    for (const auto& [arguments, shown] : all) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.out, shown) << arguments[0];
        EXPECT_EQ(result.err, told) << arguments[0];
        EXPECT_EQ(result.status, 3) << arguments[0];
    }
    EXPECT_THAT(run({"stats"}).out, HasSubstr("2 records\n"));
    const ChildResult result = run({"get", "d"});
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.status, 3);
}

TEST_F(DamagedFileTest, TheDumpOfADamagedFileIsLoadedByNobody) {
    writeFile(data, file + "\5");
    const std::string dump = run({"dump"}).out;
    const std::string json = run({"dump", "--json"}).out;
    EXPECT_THAT(dump, Not(HasSubstr("DATA=END")));
    const ChildResult bytes = run({"-f", dir.file("new"), "load"}, dump);
    EXPECT_EQ(bytes.status, 2);
    const ChildResult lines = run({"-f", dir.file("new"), "load", "--json"}, json);
    EXPECT_EQ(lines.status, 2);
    EXPECT_THAT(lines.err, HasSubstr("dump, line 5: the dump is of a damaged file: "));
    EXPECT_FALSE(std::filesystem::exists(dir.file("new")));
}

TEST_F(DamagedFileTest, NoValueIsInvented) {
    writeFile(data, file.substr(0, file.size() - 2));
    const ChildResult result = run({"get", "d"});
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.status, 3);
    EXPECT_EQ(run({"put", "x", "1"}).status, 3);
    EXPECT_THAT(run({"dump", "-p"}).out, Not(HasSubstr("fourth")));
}

TEST_F(DamagedFileTest, EachCutIsToldAndGivesOnlyWhatWasWritten) {
    for (std::size_t size = 0; size < file.size(); ++size) {
        writeFile(data, file.substr(0, size));
        std::size_t whole = 0;
        for (const std::size_t end : {b, c, d})
            whole += size >= end ? 1 : 0;
        const bool atBoundary = size == 0 || size == 31 || size == b || size == c || size == d;
        EXPECT_EQ(run({"check"}).status, atBoundary ? 0 : 3) << size;
        std::string keys;
        for (std::size_t i = 0; i < whole; ++i)
            keys += records[i].first + "\n";
        EXPECT_EQ(run({"list"}).out, keys) << size;
        const std::string fresh = dir.file("fresh");
        std::filesystem::remove(fresh);
        EXPECT_EQ(run({"salvage", "-o", fresh}).status, atBoundary ? 0 : 3) << size;
        EXPECT_EQ(readFile(fresh),
                  fileOf({records.begin(), records.begin() + static_cast<long>(whole)}))
            << size;
    }
}

TEST_F(DamagedFileTest, ALengthIsBelievedOnlyAsFarAsTheFileHasBytes) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "the sanitizers need more memory than the limit";
#endif
    const std::string small =
        fileOf({}) + number(1) + "a" + number(0xFFFFFFF0) + std::string(27, 'x');
    ASSERT_EQ(small.size(), 67U);
    writeFile(data, small);
    writeFile(dir.file("dump"), "VERSION=3\nHEADER=END\nDATA=END\n");
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"list"},
                                               {"get", "a"},
                                               {"dump"},
                                               {"dump", "--json"},
                                               {"check"},
                                               {"diff", data},
                                               {"stats"},
                                               {"salvage"},
                                               {"put", "b", "2"},
                                               {"remove", "a"},
                                               {"load", dir.file("dump")},
                                               {"load", "--replace", dir.file("dump")},
                                               {"batch", "/dev/null"}}) {
        const ChildResult result = run(arguments, "", [] {
            const struct rlimit limit = {100 << 20, 100 << 20};  // libraries take most of it
            setrlimit(RLIMIT_AS, &limit);
        });
        EXPECT_EQ(result.status, 3) << arguments[0] << result.err;
        EXPECT_EQ(stored(), small);
    }
}

TEST_F(DamagedFileTest, AWholeFileIsSalvagedWhole) {
    EXPECT_EQ(salvaged(file, "4 records salvaged, 0 gaps\n", 0), file);
    EXPECT_EQ(run({"salvage"}).out, "4 records can be salvaged, 0 gaps\n");
    EXPECT_EQ(run({"salvage"}).status, 0);
}

TEST_F(DamagedFileTest, ADamagedLengthCostsItsOwnRecordOnly) {
    const std::string without = fileOf({records[0], records[2], records[3]});
    EXPECT_EQ(salvaged(with(file, b, "\xff\xff\xff\xff"),
                       "gap at offset 45: 15 bytes, 1 record gone: key cut short: 4294967295 "
                       "bytes, 40 left\n3 records salvaged, 1 gap\n"),
              without);
    EXPECT_EQ(salvaged(with(file, b + 5, "\x06\0\0\x7f"s),
                       "gap at offset 45: 15 bytes, 1 record gone: value cut short: 2130706438 "
                       "bytes, 35 left\n3 records salvaged, 1 gap\n"),
              without);
    EXPECT_EQ(salvaged(with(file, b + 5, "\xff\xff\xff\xff"),
                       "gap at offset 45: 15 bytes, at least 1 record gone: value cut short: "
                       "4294967295 bytes, 35 left\n3 records salvaged, 1 gap\n"),
              without);
}

TEST_F(DamagedFileTest, ALengthThatLeadsIntoTheNextRecordIsFoundOut) {
    // The value's length of b is that of its value and of c's key with its length: keys pass for
    // values and values for keys.
    EXPECT_EQ(salvaged(with(file, b + 5, number(6 + 5)),
                       "gap at offset 45: 15 bytes, 1 record gone: value length cut short at "
                       "offset 79, by a length before it\n3 records salvaged, 1 gap\n"),
              fileOf({records[0], records[2], records[3]}));
}

TEST_F(DamagedFileTest, BytesBetweenRecordsCostNothing) {
    std::string more = file;
    more.insert(c, std::string(40, '\xff'));
    EXPECT_EQ(salvaged(more,
                       "gap at offset 60: 40 bytes, no record is surely gone: key cut short: "
                       "4294967295 bytes, 65 left\n4 records salvaged, 1 gap\n"),
              file);
}

TEST_F(DamagedFileTest, EachGapIsTold) {
    Pairs many;
    for (char key = 'a'; key <= 'l'; ++key)
        many.emplace_back(std::string(1, key), "value " + std::string(1, key));
    std::string damaged = fileOf(many);  // 16 bytes each
    damaged.replace(31 + 16, 4, "\xff\xff\xff\xff");
    damaged.replace(31 + 6 * 16, 4, "\xff\xff\xff\xff");
    damaged.resize(damaged.size() - 3);
    const std::string report =
        "gap at offset 47: 16 bytes, 1 record gone: key cut short: 4294967295 bytes, 169 left\n"
        "gap at offset 127: 16 bytes, 1 record gone: key cut short: 4294967295 bytes, 89 left\n"
        "gap at offset 207: 13 bytes, at least 1 record gone: value cut short: 7 bytes, 4 left\n"
        "9 records salvaged, 3 gaps\n";
    EXPECT_EQ(salvaged(damaged, report), fileOf({many[0], many[2], many[3], many[4], many[5],
                                                 many[7], many[8], many[9], many[10]}));
}

TEST_F(DamagedFileTest, WhereKeysMightBeValuesNothingIsBelieved) {
    // Both are in order, and what stands at the fault is no text, so that it may be a key, or what
    // was put between two records.
    const Pairs many{{"a", "value a"}, {"b", "value b"}, {"c", "value c"},
                     {"d", "value d"}, {"e", "value e"}, {"f", "value f"}};
    std::string damaged = fileOf(many);
    damaged.replace(31 + 16, 5, "\xff\xff\xff\xff\xff");
    damaged.resize(damaged.size() - 3);
    EXPECT_EQ(salvaged(damaged,
                       "gap at offset 47: 77 bytes, no record is surely gone: key cut short: "
                       "4294967295 bytes, 73 left\n1 record salvaged, 1 gap\n"),
              fileOf({many[0]}));
}

TEST_F(DamagedFileTest, ARefusedKeyThatADamagedLengthMadeInventsNoRecords) {
    // The version's key grew up to b, whose key is its value then, and values would be keys.
    const Pairs many{{"a", "a value"}, {"b", "b value"}, {"c", "c value"},
                     {"d", "d value"}, {"e", "e value"}, {"f", "f value"}};
    EXPECT_EQ(
        salvaged(with(fileOf(many), 0, number(31 + 16 - 4)),
                 "gap at offset 0: 31 bytes, 1 record gone: key \"_record-file-version\\03\\00\\00"
                 "\\002.0\\01\\00\\00\\00a\\07\\00\\00\\00a value\" is taken for the version\n"
                 "6 records salvaged, 1 gap\n"),
        fileOf(many));
}

TEST_F(DamagedFileTest, OfTwoRecordsWithOneKeyTheFirstOneIsTaken) {
    EXPECT_EQ(salvaged(file + recordBytes("b", "later") + recordBytes("e", "fifth"),
                       "gap at offset 89: 14 bytes, 1 record gone: key \"b\" stands twice\n"
                       "5 records salvaged, 1 gap\n"),
              fileOf(records) + recordBytes("e", "fifth"));
}

TEST_F(DamagedFileTest, ARecordWithinAValueIsNone) {
    const std::string nested = fileOf({{"bb", "not a record"}, {"bc", "neither"}});
    const std::string outer = fileOf({{"a", "1"}, {"b", nested}, {"c", "3"}});
    const std::string salvagedFile =
        salvaged(with(outer, 41, "\xff\xff\xff\xff"),
                 "gap at offset 41: " + std::to_string(9 + nested.size()) +
                     " bytes, 1 record gone: key cut short: 4294967295 bytes, " +
                     std::to_string(outer.size() - 45) + " left\n2 records salvaged, 1 gap\n");
    EXPECT_EQ(salvagedFile, fileOf({{"a", "1"}, {"c", "3"}}));
}

TEST_F(DamagedFileTest, WhatIsThereAlreadyIsNotWrittenOver) {
    writeFile(data, file);
    writeFile(dir.file("kept"), "kept");
    const ChildResult result = run({"salvage", "-o", dir.file("kept")});
    EXPECT_EQ(result.status, 4);
    EXPECT_EQ(result.err,
              "korvex-records: " + dir.file("kept") + ": is there already; not written to\n");
    EXPECT_EQ(readFile(dir.file("kept")), "kept");
    EXPECT_EQ(run({"salvage", "-o", data}).status, 4);
    EXPECT_EQ(run({"salvage", "-o", ""}).status, 2);
    EXPECT_EQ(stored(), file);
}

TEST_F(DamagedFileTest, TheRefusalNamesTheWayOut) {
    writeFile(data, file + "\5");
    const ChildResult result = run({"put", "x", "1"});
    EXPECT_EQ(result.err,
              "korvex-records: " + data +
                  ": damaged at offset 89: key length cut short; not written to (salvage "
                  "writes what is whole elsewhere)\n");
}

}  // namespace
