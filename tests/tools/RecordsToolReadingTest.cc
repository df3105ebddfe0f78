#include <sys/file.h>
#include <sys/stat.h>
#include <sys/wait.h>

#include <map>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;

using Arguments = std::vector<std::string>;

class ReadingTest : public RecordsToolTest {
  protected:
    std::vector<Arguments> readingVerbs() const {
        return {{"list"},  {"list", "-l"},  {"get", "a"}, {"dump"},    {"dump", "--json"},
                {"check"}, {"diff", other}, {"stats"},    {"salvage"}, {"load", "--dry-run"}};
    }
    // Each file below the test's directory with what would show that it was touched.
    std::map<std::string, std::string> everything() const {
        std::map<std::string, std::string> all;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(dir.path())) {
            struct stat st {};
            lstat(entry.path().c_str(), &st);
            all[entry.path()] = std::to_string(st.st_ino) + " " + std::to_string(st.st_mode) + " " +
                                std::to_string(st.st_mtim.tv_sec) + "." +
                                std::to_string(st.st_mtim.tv_nsec) + " " +
                                std::to_string(st.st_ctim.tv_nsec);
        }
        all.erase(dir.file("input"));
        return all;
    }
    // By a shell that knows the tool as $tool.
    ChildResult shell(const std::string& script) const {
        return runInChild([&] {
            setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
            setenv("KORVEX_DB", dir.file("db").c_str(), 1);
            setenv("tool", KORVEX_RECORDS, 1);
            execl("/bin/sh", "sh", "-c", script.c_str(), nullptr);
            return 127;
        });
    }

    const std::string other = dir.file("other");
    const std::string dump = "VERSION=3\nHEADER=END\n 62\n 32\nDATA=END\n";
};

TEST_F(ReadingTest, NoReadingVerbChangesOrCreatesAnything) {
    for (const std::string& content :
         {fileOf({{"a", "1"}, {"b", "2"}}), fileOf({{"a", "1"}}) + "\5", ""s}) {
        writeFile(data, content);
        writeFile(data + ".copy", fileOf({{"a", "old"}}));
        writeFile(other, content);
        run({"check"});  // so that the input's file is there
        const auto before = everything();
        for (const Arguments& arguments : readingVerbs()) {
            run(arguments, dump);
            EXPECT_EQ(everything(), before) << arguments[0];
        }
    }
}

TEST_F(ReadingTest, AMistypedNameLeavesNoTrace) {
    const auto before = everything();
    for (Arguments arguments : readingVerbs()) {
        if (arguments.back() == "--dry-run") continue;
        arguments.insert(arguments.begin(), {"-f", dir.file("mistyped")});
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 4) << arguments[2];
        EXPECT_EQ(result.out, "") << arguments[2];
    }
    EXPECT_EQ(everything(), before);
}

TEST_F(ReadingTest, AStoreThatWasNeverSavedIsNoEmptyOne) {
    writeFile(other, fileOf({}));
    for (const Arguments& arguments : std::vector<Arguments>{
             {"list"}, {"get", "a"}, {"dump"}, {"diff", other}, {"stats"}, {"remove", "a"}}) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 4) << arguments[0];
        EXPECT_EQ(result.err, "korvex-records: " + data + ": no such file\n");
    }
}

TEST_F(ReadingTest, NobodyIsWaitedFor) {
    writeFile(data, fileOf({{"a", "1"}}));
    writeFile(other, fileOf({{"a", "1"}}));
    const int fd = open(data.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    for (const Arguments& arguments : readingVerbs())
        EXPECT_EQ(run(arguments, dump).status, 0) << arguments[0];
    close(fd);
}

TEST_F(ReadingTest, NobodysReadingShutsAWriterOut) {
    writeFile(data, fileOf({{"a", std::string(200000, 'x')}}));
    const ChildResult result = shell("$tool get a | { $tool --wait 0 put b 2; cat > /dev/null; }");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(run({"get", "b"}).out, "2");
}

TEST_F(ReadingTest, AListThatIsReadKeyByKeyDoesNotDeadlock) {
    if (isEmulated()) GTEST_SKIP() << "the shell knows no emulator";
    std::vector<std::pair<std::string, std::string>> records;
    for (int i = 100; i < 160; ++i)  // more than a pipe holds
        records.emplace_back(std::string(2000, 'k') + std::to_string(i), std::to_string(i) + "\n");
    writeFile(data, fileOf(records));
    const ChildResult result = shell(
        "$tool list | while read -r k; do"
        " $tool get \"$k\" && $tool put --wait 20 \"$k\" new || exit 1; done");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(std::count(result.out.begin(), result.out.end(), '\n'), 60);
    EXPECT_EQ(run({"get", records[59].first}).out, "new");
}

TEST_F(ReadingTest, WhatIsReadIsOneMomentsRecords) {
    if (isEmulated()) GTEST_SKIP() << "the shell knows no emulator";
    std::vector<std::pair<std::string, std::string>> records;
    for (int i = 100; i < 400; ++i)
        records.emplace_back("key" + std::to_string(i), std::string(1000, 'v'));
    writeFile(data, fileOf(records));
    const std::string before = run({"dump"}).out;
    const ChildResult result =
        shell("$tool dump | { head -c 100; $tool put key399 changed; cat; }");
    EXPECT_EQ(result.out, before);
    EXPECT_EQ(run({"get", "key399"}).out, "changed");
}

TEST_F(ReadingTest, AReaderBesideManyWritersNeverFails) {
    writeFile(data, fileOf({{"a", "1"}}));
    std::vector<pid_t> writers;
    for (int i = 0; i < 6; ++i) {
        writers.push_back(fork());
        if (writers.back() != 0) continue;
        bool fine = true;
        for (int k = 0; k < 10; ++k)
            fine = runInChild([&] {
                       return execTool({"put", std::to_string(i) + "-" + std::to_string(k), "v"});
                   }).status == 0 &&
                   fine;
        _exit(fine ? 0 : 1);
    }
    for (int i = 0; i < 60; ++i) {
        const ChildResult result = run({"get", "a"});
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.out, "1");
    }
    for (const pid_t writer : writers) {
        int status = -1;
        waitpid(writer, &status, 0);
        EXPECT_EQ(status, 0);
    }
    EXPECT_THAT(run({"check"}).out, HasSubstr("whole, version \"2.0\", 61 records"));
}

TEST_F(ReadingTest, KeysAreListedInOrderWhateverTheFiles) {
    writeFile(data, recordBytes("b", "2") + recordBytes("c", "33") + recordBytes("a", "1"));
    EXPECT_EQ(run({"list", "-l"}).out, "         1  a\n         1  b\n         2  c\n");
    EXPECT_THAT(run({"check"}).out, HasSubstr("whole, no version, 3 records"));
    writeFile(data, recordBytes("b", "2") + recordBytes("a", "1") + recordBytes("b", "2"));
    EXPECT_THAT(run({"check"}).out, HasSubstr("after 2 records: key \"b\" stands twice"));
}

TEST_F(ReadingTest, AValueOfAnySizeIsReadWhole) {
    for (const std::size_t size : {131071, 131072, 131073, 400000}) {
        std::string value(size, 'v');
        value[size / 2] = '\0';
        writeFile(data, fileOf({{"a", value}, {"b", "2"}}));
        EXPECT_TRUE(run({"get", "a"}).out == value) << size;
        EXPECT_EQ(run({"get", "-x", "a"}).out.size(), 2 * size + 1);
        EXPECT_EQ(run({"get", "b"}).out, "2");
        writeFile(other, fileOf({{"a", value + "x"}, {"b", "2"}}));
        EXPECT_EQ(run({"diff", "-l", other}).out.substr(23),
                  "  a  from byte " + std::to_string(size) + "\n");
    }
}

}  // namespace
