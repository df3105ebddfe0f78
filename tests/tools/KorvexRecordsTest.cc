#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

// The tool as a user runs it: a process of its own each time.

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::ChildResult;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::writeFile;

class KorvexRecordsTest : public testing::Test {
  protected:
    KorvexRecordsTest()
        : _db(_dir.file("db")), _data(_dir.file("db/hashDb/data")), _home(_dir.file("home")) {
        for (const std::string& dir : {_db, _db + "/hashDb", _home, _home + "/etc"}) {
            EXPECT_EQ(mkdir(dir.c_str(), 0700), 0);
        }
        writeFile(_home + "/etc/log-cmdline.cfg",
                  "rootCategory=DEBUG,A\nappender.A.fileName=${KORVEX_HOME}/log\n");
    }

    ChildResult run(const std::vector<std::string>& arguments, const std::string& input = "") {
        const std::string in = _dir.file("stdin");
        writeFile(in, input);
        return runInChild([&] {
            if (_home.empty() ? unsetenv("KORVEX_HOME") : setenv("KORVEX_HOME", _home.c_str(), 1)) {
                return 98;
            }
            if (_db.empty() ? unsetenv("KORVEX_DB") : setenv("KORVEX_DB", _db.c_str(), 1))
                return 98;
            dup2(open(in.c_str(), O_RDONLY), 0);
            if (_stdout == "closed") close(1);
            if (!_stdout.empty() && _stdout != "closed") dup2(open(_stdout.c_str(), O_WRONLY), 1);
            if (_sizeLimit > 0) {
                const struct rlimit limit { _sizeLimit, _sizeLimit };
                setrlimit(RLIMIT_FSIZE, &limit);
                signal(SIGXFSZ, SIG_IGN);
            }
            testsupport::execTool(arguments);
            return 97;
        });
    }
    // What the tool prints when all goes well.
    std::string outOf(const std::vector<std::string>& arguments, const std::string& input = "") {
        const ChildResult result = run(arguments, input);
        EXPECT_EQ(result.status, 0) << result.err;
        return result.out;
    }
    int statusOf(const std::vector<std::string>& arguments, const std::string& input = "") {
        return run(arguments, input).status;
    }
    std::vector<std::string> namesBesideData() const {
        std::vector<std::string> all;
        for (const auto& e : std::filesystem::directory_iterator(_dir.file("db/hashDb"))) {
            all.push_back(e.path().filename().string());
        }
        std::sort(all.begin(), all.end());
        return all;
    }

    TempDir _dir;
    std::string _db;
    const std::string _data;
    std::string _home;
    std::string _stdout;
    rlim_t _sizeLimit = 0;
};

const std::string kVersion(
    "\x14\0\0\0_record-file-version\x03\0\0\0"
    "2.0",
    31);
const std::string kA1(
    "\1\0\0\0a\1\0\0\0"
    "1",
    10);

TEST_F(KorvexRecordsTest, RecordsSurviveTheProcess) {
    EXPECT_EQ(outOf({"put", "a", "1"}), "");
    EXPECT_EQ(readFile(_data), kVersion + kA1);
    EXPECT_EQ(outOf({"put", "b", "two"}), "");
    EXPECT_EQ(outOf({"get", "b"}), "two");
    EXPECT_EQ(outOf({"list"}), "a\nb\n");
    EXPECT_EQ(outOf({"remove", "b"}), "");
    EXPECT_EQ(outOf({"list"}), "a\n");
    EXPECT_EQ(readFile(_data), kVersion + kA1);
    EXPECT_THAT(readFile(_home + "/log"), HasSubstr("Writing record file to disk.\n"));
    EXPECT_THAT(namesBesideData(), ElementsAre("data"));
}

TEST_F(KorvexRecordsTest, TheSetUpSpeaksOnRequestAndOnStandardErrorOnly) {
    outOf({"put", "a", "1"});
    ChildResult result = run({"get", "a"});
    EXPECT_EQ(result.out, "1");
    EXPECT_EQ(result.err, "");
    result = run({"--verbose", "get", "a"});
    EXPECT_EQ(result.out, "1");
    EXPECT_EQ(result.err, "Using logging configuration at " + _home + "/etc/log-cmdline.cfg.\n");
}

TEST_F(KorvexRecordsTest, WithoutAHomeTheStatusIs255) {
    _home.clear();
    const ChildResult result = run({"list"});
    EXPECT_EQ(result.status, 255);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, "KORVEX_HOME must be set.  Stopping.\n");
}

TEST_F(KorvexRecordsTest, AnUnusableDatabaseDirectoryIsWrongUsage) {
    const std::pair<std::string, const char*> all[] = {
        {"", "The environment variable KORVEX_DB must not be empty."},
        {"relative", "The environment variable KORVEX_DB must not be a relative path."},
        {_dir.file("none"), "The environment variable KORVEX_DB must point to an existing path."},
        {_home + "/etc/log-cmdline.cfg",
         "The environment variable KORVEX_DB must point to a directory."}};
    for (const auto& [db, message] : all) {
        _db = db;
        const ChildResult result = run({"list"});
        EXPECT_EQ(result.status, 2);
        EXPECT_THAT(result.err, HasSubstr(std::string("korvex-records: ") + message + "\n"));
    }
}

TEST_F(KorvexRecordsTest, WrongUsageChangesNothing) {
    const std::vector<std::vector<std::string>> all = {{},
                                                       {"unknown"},
                                                       {"get"},
                                                       {"get", "a", "b"},
                                                       {"put", "a"},
                                                       {"put"},
                                                       {"remove"},
                                                       {"check", "x"},
                                                       {"list", "a", "b"},
                                                       {"--nonsense", "list"},
                                                       {"-i", "f", "put", "a", "v"},
                                                       {"put", "_record-file-version", "x"},
                                                       {"put", "_Record-File-VersionX", "x"},
                                                       {"-f"}};
    for (const auto& arguments : all) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 2) << testing::PrintToString(arguments);
        EXPECT_EQ(result.err.compare(0, 16, "korvex-records: "), 0) << result.err;
    }
    EXPECT_THAT(namesBesideData(), testing::IsEmpty());
}

TEST_F(KorvexRecordsTest, HelpAndVersion) {
    const std::string help = outOf({"--help"});
    for (const char* word : {"\n  list [PREFIX] ", "--create", "-f, --file=FILE"}) {
        EXPECT_THAT(help, HasSubstr(word));
    }
    EXPECT_EQ(outOf({"--version"}), "korvex-records 1.0.0\n");
}

TEST_F(KorvexRecordsTest, ListingEscapesOrNot) {
    outOf({"put", "a\\b\tc", "12"});
    outOf({"put", "ab", "123"});
    outOf({"put", "b", ""});
    EXPECT_EQ(outOf({"list"}), "a\\\\b\\09c\nab\nb\n");
    EXPECT_EQ(outOf({"list", "ab"}), "ab\n");
    EXPECT_EQ(outOf({"-l", "list"}), "         2  a\\\\b\\09c\n         3  ab\n         0  b\n");
    EXPECT_EQ(outOf({"list", "-0"}), std::string("a\\b\tc\0ab\0b\0", 11));
    EXPECT_EQ(statusOf({"list", "x"}), 1);
}

TEST_F(KorvexRecordsTest, ValuesComeFromArgumentsInputAndFiles) {
    const std::string bytes("\0\1\xff\n", 4);
    writeFile(_dir.file("value"), bytes);
    outOf({"put", "input", "-"}, bytes);
    outOf({"put", "-i", _dir.file("value"), "file"});
    outOf({"put", "empty", ""});
    outOf({"--", "put", "-key", "-value"});
    EXPECT_EQ(outOf({"get", "input"}), bytes);
    EXPECT_EQ(outOf({"get", "file"}), bytes);
    EXPECT_EQ(outOf({"get", "empty"}), "");
    EXPECT_EQ(outOf({"get", "--", "-key"}), "-value");
    EXPECT_EQ(outOf({"get", "-x", "file"}), "0001ff0a\n");
    EXPECT_EQ(statusOf({"put", "-i", _dir.file("none"), "x"}), 4);
    EXPECT_EQ(statusOf({"put", "-i", _dir.path(), "x"}), 4);
}

TEST_F(KorvexRecordsTest, AnAbsentKeyIsStatusOne) {
    outOf({"put", "a", "1"});
    EXPECT_EQ(statusOf({"get", "b"}), 1);
    const ChildResult result = run({"remove", "b", "a", "c"});
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("korvex-records: b: no such key\n"));
    EXPECT_THAT(result.err, HasSubstr("korvex-records: c: no such key\n"));
    EXPECT_EQ(statusOf({"list"}), 1) << "those that were there are gone";
    EXPECT_EQ(readFile(_data), kVersion);
}

TEST_F(KorvexRecordsTest, ADumpReadsBack) {
    const std::string value("\0\\ a\xff", 5);
    outOf({"put", "a\nb", "-"}, value);
    outOf({"put", "c", ""});
    const std::string before = readFile(_data);
    const std::string bytes = outOf({"dump"});
    EXPECT_EQ(bytes,
              "VERSION=3\nformat=bytevalue\ntype=btree\nHEADER=END\n"
              " 610a62\n 005c2061ff\n 63\n \nDATA=END\n");
    const std::string print = outOf({"dump", "-p"});
    EXPECT_EQ(print,
              "VERSION=3\nformat=print\ntype=btree\nHEADER=END\n"
              " a\\0ab\n \\00\\5c a\\ff\n c\n \nDATA=END\n");
    for (const std::string& dump : {bytes, print}) {
        unlink(_data.c_str());
        outOf({"load"}, dump);
        EXPECT_EQ(readFile(_data), before);
        unlink(_data.c_str());
        writeFile(_dir.file("dump"), dump);
        outOf({"load", _dir.file("dump")});
        EXPECT_EQ(readFile(_data), before);
    }
    EXPECT_EQ(outOf({"dump", "c"}),
              "VERSION=3\nformat=bytevalue\ntype=btree\nHEADER=END\n 63\n \nDATA=END\n");
    EXPECT_EQ(statusOf({"dump", "x"}), 1);
}

TEST_F(KorvexRecordsTest, LoadAddsToWhatIsThereAndSavesOnce) {
    outOf({"put", "a", "1"});
    unlink((_home + "/log").c_str());
    outOf({"load"}, "VERSION=3\nHEADER=END\n 62\n 32\n 61\n 33\nDATA=END\n");
    EXPECT_EQ(outOf({"dump", "-p"}),
              "VERSION=3\nformat=print\ntype=btree\nHEADER=END\n a\n 3\n b\n 2\nDATA=END\n");
    EXPECT_EQ(readFile(_home + "/log"), "Writing record file to disk.\n");
}

TEST_F(KorvexRecordsTest, ABadDumpChangesNothing) {
    outOf({"put", "a", "1"});
    const std::string head = "VERSION=3\nformat=bytevalue\nHEADER=END\n";
    const std::string printHead = "VERSION=3\nformat=print\nHEADER=END\n";
    const std::string all[] = {
        "",
        "VERSION=2\nHEADER=END\nDATA=END\n",
        "VERSION=3\n",
        "VERSION=3\nnonsense\nHEADER=END\nDATA=END\n",
        "VERSION=3\nformat=other\nHEADER=END\nDATA=END\n",
        head,
        head + " 62\n 32\n",
        head + " 62\nDATA=END\n",
        head + " 62\n 3\nDATA=END\n",
        head + " 62\n 3g\nDATA=END\n",
        head + "62\n 32\nDATA=END\n",
        head + "\n 32\nDATA=END\n",
        head + " 62\n 32\n 5f7265636f72642d66696c652d76657273696f6e\n 32\nDATA=END\n",
        head + " 620063\n 32\nDATA=END\n",
        printHead + " b\n \\4\nDATA=END\n",
        printHead + " b\n \\\nDATA=END\n"};
    for (const std::string& dump : all) {
        EXPECT_EQ(statusOf({"load"}, dump), 2) << dump;
    }
    EXPECT_EQ(readFile(_data), kVersion + kA1);
    EXPECT_EQ(statusOf({"load", _dir.file("none")}), 4);
}

TEST_F(KorvexRecordsTest, CheckSaysWhatTheFileHolds) {
    EXPECT_EQ(statusOf({"check"}), 4) << "there is no file";
    const auto check = [&](const std::string& content, int status) {
        writeFile(_data, content);
        const ChildResult result = run({"check"});
        EXPECT_EQ(result.status, status) << result.out;
        EXPECT_EQ(result.out.compare(0, _data.size() + 2, _data + ": "), 0);
        return result.out.substr(_data.size() + 2);
    };
    EXPECT_EQ(check(kVersion + kA1, 0), "whole, version \"2.0\", 1 record, 41 bytes\n");
    EXPECT_EQ(check("", 0), "whole, no version, 0 records, 0 bytes\n");
    EXPECT_EQ(check(kA1, 0), "whole, no version, 1 record, 10 bytes\n");
    const auto damaged = [&](const std::string& tail) { return check(kVersion + kA1 + tail, 3); };
    const std::string at = "damaged at offset 41 after 1 record: ";
    EXPECT_EQ(damaged(std::string("\1\0\0", 3)), at + "key length cut short\n");
    EXPECT_EQ(damaged(std::string("\5\0\0\0ab", 6)), at + "key cut short: 5 bytes, 2 left\n");
    EXPECT_EQ(damaged(std::string("\1\0\0\0b\1", 6)), at + "value length cut short\n");
    EXPECT_EQ(damaged(std::string("\1\0\0\0b\xff\xff\xff\xffx", 10)),
              at + "value cut short: 4294967295 bytes, 1 left\n");
    EXPECT_EQ(damaged(kA1), at + "key \"a\" stands twice\n");
    EXPECT_EQ(damaged(kVersion), at + "key \"_record-file-version\" is taken for the version\n");
    EXPECT_EQ(damaged(std::string("\3\0\0\0b\0c\0\0\0\0", 11)),
              at + "key \"b\\00c\" holds a NUL\n");
    EXPECT_THAT(namesBesideData(), ElementsAre("data")) << "it makes nothing";
}

TEST_F(KorvexRecordsTest, ADamagedFileIsReadButNotWritten) {
    const std::string content = kVersion + kA1 + "\5";
    writeFile(_data, content);
    ChildResult result = run({"list"});
    EXPECT_EQ(result.status, 3);
    EXPECT_EQ(result.out, "a\n");
    EXPECT_THAT(result.err, HasSubstr("damaged at offset 41: key length cut short\n"));
    EXPECT_EQ(run({"get", "a"}).out, "1");
    EXPECT_EQ(statusOf({"get", "a"}), 3);
    EXPECT_EQ(statusOf({"dump"}), 3);
    EXPECT_EQ(statusOf({"put", "b", "2"}), 3);
    EXPECT_EQ(statusOf({"remove", "a"}), 3);
    EXPECT_EQ(statusOf({"load"}, "VERSION=3\nHEADER=END\nDATA=END\n"), 3);
    EXPECT_EQ(readFile(_data), content);
    EXPECT_EQ(statusOf({"batch"}, "put\tb\t2\n"), 3);
    EXPECT_EQ(readFile(_data), content);
}

TEST_F(KorvexRecordsTest, AnotherFileCanBeNamed) {
    _db.clear();
    EXPECT_EQ(outOf({"-f", _dir.file("other"), "put", "a", "1"}), "");
    EXPECT_EQ(readFile(_dir.file("other")), kVersion + kA1);
    ASSERT_EQ(symlink("other", _dir.file("link").c_str()), 0);
    EXPECT_EQ(outOf({"-f", _dir.file("link"), "put", "a", "1"}), "");
    struct stat st {};
    EXPECT_EQ(lstat(_dir.file("link").c_str(), &st), 0);
    EXPECT_TRUE(S_ISLNK(st.st_mode));
}

TEST_F(KorvexRecordsTest, TheDirectoryIsMadeOnRequestOnly) {
    std::filesystem::remove_all(_db + "/hashDb");
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"put", "a", "1"}, {"list"}, {"check"}}) {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 4);
        EXPECT_EQ(result.err, "korvex-records: " + _db +
                                  "/hashDb: no such directory; put, load and batch make it with "
                                  "--create\n");
    }
    EXPECT_EQ(statusOf({"--create", "put", "_record-file-version", "1"}), 2);
    EXPECT_EQ(statusOf({"--create", "load"}, "VERSION=3\n"), 2);
    EXPECT_EQ(statusOf({"--create", "batch"}, "remove\ta\n"), 1);
    EXPECT_EQ(statusOf({"--create", "load", "--dry-run"}, "VERSION=3\nHEADER=END\nDATA=END\n"), 0);
    EXPECT_FALSE(std::filesystem::exists(_db + "/hashDb")) << "nothing was put there";
    EXPECT_EQ(statusOf({"--create", "put", "a", "1"}), 0);
    EXPECT_EQ(readFile(_data), kVersion + kA1);
    struct stat st {};
    EXPECT_EQ(stat((_db + "/hashDb").c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 07777, 0700U);
}

TEST_F(KorvexRecordsTest, WhatIsNoFileIsRefused) {
    ASSERT_EQ(mkdir(_data.c_str(), 0700), 0);
    for (const char* verb : {"list", "check"})
        EXPECT_EQ(statusOf({verb}), 4) << verb;
    EXPECT_EQ(statusOf({"put", "a", "1"}), 4);
}

TEST_F(KorvexRecordsTest, LostOutputIsNoticed) {
    if (access("/dev/full", W_OK) != 0) GTEST_SKIP() << "/dev/full is not there";
    outOf({"put", "a", "1"});
    _stdout = "/dev/full";
    for (const char* verb : {"list", "dump", "check"})
        EXPECT_EQ(statusOf({verb}), 4) << verb;
    EXPECT_EQ(statusOf({"get", "a"}), 4);
    EXPECT_EQ(statusOf({"--version"}), 4);
}

TEST_F(KorvexRecordsTest, AClosedStandardOutputIsLostOutputAndWritesNowhereElse) {
    outOf({"put", "a", "1"});
    const std::string before = readFile(_data);
    _stdout = "closed";
    EXPECT_EQ(statusOf({"get", "a"}), 4);
    EXPECT_EQ(statusOf({"list"}), 4);
    EXPECT_EQ(statusOf({"put", "a", "1"}), 0) << "it has nothing to print";
    EXPECT_EQ(readFile(_data), before);
}

TEST_F(KorvexRecordsTest, ASaveThatFailsLeavesTheOldFileAndTellsTheReason) {
    outOf({"put", "a", "1"});
    std::filesystem::permissions(_data, std::filesystem::perms(0640));
    const std::string before = readFile(_data);
    _sizeLimit = 200;
    const ChildResult result = run({"put", "b", std::string(300, 'x')});
    EXPECT_EQ(result.status, 4);
    EXPECT_THAT(result.err, HasSubstr("korvex-records: cannot save " + _data + ": writing " + _db +
                                      "/hashDb/.korvex-records."));
    EXPECT_THAT(result.err, HasSubstr(": File too large\n"));
    EXPECT_EQ(readFile(_data), before);
    EXPECT_EQ(std::filesystem::status(_data).permissions(), std::filesystem::perms(0640));
    EXPECT_THAT(namesBesideData(), ElementsAre("data"));
}

TEST_F(KorvexRecordsTest, RunsWaitForEachOtherAndOfFirstOnesNoneIsLost) {
    std::filesystem::remove_all(_db + "/hashDb");
    std::vector<pid_t> children;
    for (int i = 0; i < 8; ++i) {
        const pid_t pid = fork();
        if (pid == 0) _exit(statusOf({"--create", "put", "key" + std::to_string(i), "v"}));
        children.push_back(pid);
    }
    for (const pid_t pid : children) {
        int status = 0;
        ASSERT_EQ(waitpid(pid, &status, 0), pid);
        EXPECT_EQ(status, 0);
    }
    EXPECT_EQ(outOf({"list"}), "key0\nkey1\nkey2\nkey3\nkey4\nkey5\nkey6\nkey7\n");
}

}  // namespace
