#include <sys/file.h>
#include <sys/prctl.h>
#include <sys/ptrace.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <sys/xattr.h>

#include <linux/capability.h>

#include <csignal>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::ElementsAre;
using testing::HasSubstr;

const std::string kOurs = ".korvex-records.0123456789abcdef";

class WritingTest : public RecordsToolTest {
  protected:
    WritingTest() { writeFile(data, before); }

    std::string beside(const std::string& name) const { return dir.file("db/hashDb/" + name); }
    using RecordsToolTest::beside;

    void expectRefused(const std::vector<std::string>& arguments, const std::string& why) const {
        const ChildResult result = run(arguments);
        EXPECT_EQ(result.status, 4);
        EXPECT_EQ(result.err, "korvex-records: " + why + "\n");
    }

    const std::string before = fileOf({{"a", "1"}});
    const std::string after = fileOf({{"a", "1"}, {"b", "2"}});
};

TEST_F(WritingTest, AStaleCopyNeverReplacesNewerRecords) {
    writeFile(data + ".copy", fileOf({{"old", "1"}}));
    const std::string damaged = before + "\5";
    writeFile(data, damaged);
    EXPECT_EQ(run({"list"}).out, "a\n");
    EXPECT_EQ(run({"put", "b", "2"}).status, 3);
    EXPECT_EQ(stored(), damaged);
    writeFile(data, before);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_EQ(stored(), after);
    EXPECT_EQ(readFile(data + ".copy"), fileOf({{"old", "1"}}));
}

TEST_F(WritingTest, ALockMadeByRootShutsNobodyOut) {
    writeFile(data + ".lock", "");
    ASSERT_EQ(chmod((data + ".lock").c_str(), 0), 0);
    const int fd = open((data + ".lock").c_str(), O_RDONLY | O_CLOEXEC);
    if (fd >= 0) flock(fd, LOCK_EX);
    EXPECT_EQ(run({"--wait", "0", "put", "b", "2"}).status, 0);
    EXPECT_EQ(stored(), after);
    EXPECT_THAT(beside(), ElementsAre("data", "data.lock"));
    close(fd);
}

TEST_F(WritingTest, NoFileOfTheUsersIsTouched) {
    for (const char* name : {"data.new", "data.copy", "data.lock", "data.copy.unfinished",
                             ".korvex-records.0123456789abcde", ".korvex-records.0123456789ABCDEF",
                             ".korvex-records.0123456789abcdef0"}) {
        writeFile(beside(name), "");
    }
    writeFile(beside(".korvex-records.1111111111111111"), "no record file");
    writeFile(beside(".korvex-records.2222222222222222"), "");
    ASSERT_EQ(link(beside(".korvex-records.2222222222222222").c_str(), dir.file("kept").c_str()),
              0);
    std::filesystem::create_symlink(data, beside(".korvex-records.3333333333333333"));
    std::filesystem::create_directory(beside(".korvex-records.4444444444444444"));
    const auto names = beside();
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_EQ(stored(), after);
    EXPECT_EQ(beside(), names);
    EXPECT_EQ(readFile(beside(".korvex-records.1111111111111111")), "no record file");
}

TEST_F(WritingTest, WhatAKilledRunLeftIsSweptByAWriterOnly) {
    for (const std::string& left : {fileOf({{"x", "1"}}), fileOf({}).substr(0, 20), ""s}) {
        writeFile(beside(kOurs), left);
        EXPECT_EQ(run({"list"}).status, 0);
        EXPECT_THAT(beside(), ElementsAre(kOurs, "data"));
        EXPECT_EQ(run({"put", "b", "2"}).status, 0);
        EXPECT_THAT(beside(), ElementsAre("data"));
        EXPECT_EQ(stored(), after);
    }
}

TEST_F(WritingTest, TheNewFileOfARunThatLivesStays) {
    writeFile(beside(kOurs), fileOf({{"x", "1"}}));
    const int fd = open(beside(kOurs).c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_THAT(beside(), ElementsAre(kOurs, "data"));
    close(fd);
}

TEST_F(WritingTest, TheOtherNameOfAFirstFileWhoseMakerWasKilledIsSwept) {
    ASSERT_EQ(link(data.c_str(), beside(kOurs).c_str()), 0);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_THAT(beside(), ElementsAre("data"));
    EXPECT_EQ(stored(), after);
}

TEST_F(WritingTest, AFileWithFurtherHardLinksIsRefused) {
    ASSERT_EQ(link(data.c_str(), dir.file("other").c_str()), 0);
    expectRefused({"put", "b", "2"}, data +
                                         ": has 1 further hard link, which would keep the old "
                                         "records; not written to");
    EXPECT_EQ(stored(), before);
    EXPECT_THAT(beside(), ElementsAre("data"));
}

TEST_F(WritingTest, ADanglingLinkIsRefused) {
    std::filesystem::remove(data);
    std::filesystem::create_symlink(dir.file("not-mounted/data"), data);
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"put", "b", "2"}, {"remove", "b"}, {"list"}, {"get", "a"}, {"dump"}, {"check"}}) {
        expectRefused(arguments, data + ": a symbolic link to a file that is not there");
    }
    EXPECT_EQ(run({"load"}, "VERSION=3\nHEADER=END\nDATA=END\n").status, 4);
    EXPECT_EQ(run({"batch"}, "put\ta\t1\n").status, 4);
    EXPECT_TRUE(std::filesystem::is_symlink(data));
    EXPECT_FALSE(std::filesystem::exists(dir.file("not-mounted")));
}

TEST_F(WritingTest, ADanglingLinkToTheDirectoryIsRefused) {
    const std::string hashDb = dir.file("db/hashDb");
    std::filesystem::remove_all(hashDb);
    std::filesystem::create_symlink(dir.file("not-mounted"), hashDb);
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"put", "b", "2"}, {"--create", "put", "b", "2"}, {"list"}}) {
        expectRefused(arguments, hashDb + ": a symbolic link to a file that is not there");
    }
    EXPECT_TRUE(std::filesystem::is_symlink(hashDb));
    EXPECT_FALSE(std::filesystem::exists(dir.file("not-mounted")));
}

TEST_F(WritingTest, LinksToTheFileAreFollowedAndItsDirectoryIsUsed) {
    std::filesystem::create_directory(dir.file("real"));
    std::filesystem::rename(data, dir.file("real/records"));
    std::filesystem::create_symlink("second", data);
    std::filesystem::create_symlink(dir.file("real/records"), beside("second"));
    writeFile(dir.file("real/" + kOurs), "");
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_TRUE(std::filesystem::is_symlink(data));
    EXPECT_EQ(readFile(dir.file("real/records")), after);
    EXPECT_FALSE(std::filesystem::exists(dir.file("real/" + kOurs))) << "swept there";
}

TEST_F(WritingTest, ExtendedAttributesStay) {
    if (setxattr(data.c_str(), "user.note", "kept\0too", 8, 0) != 0) {
        GTEST_SKIP() << "the file system has no extended attributes";
    }
    ASSERT_EQ(setxattr(data.c_str(), "user.large", std::string(1000, 'x').data(), 1000, 0), 0);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    char value[2000];
    ASSERT_EQ(getxattr(data.c_str(), "user.note", value, sizeof value), 8);
    EXPECT_EQ(std::string(value, 8), "kept\0too"s);
    EXPECT_EQ(getxattr(data.c_str(), "user.large", value, sizeof value), 1000);
}

// What getfacl(1) says without the name and the owner.
std::string accessOf(const std::string& file) {
    return runInChild([&] {
               execlp("getfacl", "getfacl", "-cnp", file.c_str(), nullptr);
               return 127;
           })
        .out;
}

bool setAccess(const std::vector<const char*>& arguments) {
    return runInChild([&] {
               std::vector<const char*> argv{"setfacl"};
               argv.insert(argv.end(), arguments.begin(), arguments.end());
               argv.push_back(nullptr);
               execvp("setfacl", const_cast<char**>(argv.data()));
               return 127;
           }).status == 0;
}

TEST_F(WritingTest, AnAccessControlListStaysAndTheDirectorysDefaultIsNotTakenOver) {
    ASSERT_EQ(chmod(data.c_str(), 0640), 0);
    if (!setAccess({"-m", "u:1234:rw,g:4321:r", data.c_str()})) {
        GTEST_SKIP() << "no setfacl, or a file system without access control lists";
    }
    ASSERT_TRUE(setAccess({"-d", "-m", "u:77:rwx", beside("").c_str()}));
    const std::string listed = accessOf(data);
    EXPECT_THAT(listed, HasSubstr("user:1234:rw-\n"));
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    EXPECT_EQ(stored(), after);
    EXPECT_EQ(accessOf(data), listed);

    ASSERT_TRUE(setAccess({"-b", data.c_str()}));
    const std::string plain = accessOf(data);
    EXPECT_EQ(run({"put", "c", "3"}).status, 0);
    EXPECT_EQ(accessOf(data), plain);
}

TEST_F(WritingTest, TheOwnerStaysOrNothingIsWritten) {
    if (geteuid() != 0) GTEST_SKIP() << "only root may give files away";
    ASSERT_EQ(chown(data.c_str(), 1234, 4321), 0);
    EXPECT_EQ(run({"put", "b", "2"}).status, 0);
    struct stat st {};
    ASSERT_EQ(stat(data.c_str(), &st), 0);
    EXPECT_EQ(st.st_uid, 1234U);
    EXPECT_EQ(st.st_gid, 4321U);
    const ChildResult result =
        run({"put", "c", "3"}, "", [] { prctl(PR_CAPBSET_DROP, CAP_CHOWN, 0, 0, 0); });
    EXPECT_EQ(result.status, 4);
    EXPECT_EQ(result.err,
              "korvex-records: cannot keep the owner of " + data + ": Operation not permitted\n");
    EXPECT_EQ(stored(), after);
    EXPECT_THAT(beside(), ElementsAre("data"));
}

TEST_F(WritingTest, WaitingHasAnEndIfThatIsWanted) {
    const int fd = open(data.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    const std::string busy = data + ": another run is changing it; waited ";
    expectRefused({"--wait", "0", "put", "b", "2"}, busy + "0 seconds");
    expectRefused({"remove", "--wait=1", "a"}, busy + "1 second");
    EXPECT_EQ(run({"batch", "--wait", "0"}, "put\tb\t2\n").status, 4);
    EXPECT_EQ(run({"load", "--wait", "0"}, "VERSION=3\nHEADER=END\nDATA=END\n").status, 4);
    EXPECT_EQ(stored(), before);
    close(fd);
    EXPECT_EQ(run({"--wait", "0", "put", "b", "2"}).status, 0);
}

TEST_F(WritingTest, InputIsReadBeforeAnythingIsLocked) {
    if (isEmulated()) GTEST_SKIP() << "the shell knows no emulator";
    for (const char* verb : {"load", "batch", "put x -"}) {
        writeFile(data, before);
        const std::string lines = verb == "batch"s
                                      ? "printf 'put\\tc\\t3\\n'"
                                      : "printf 'VERSION=3\\nHEADER=END\\n 63\\n 33\\nDATA=END\\n'";
        const std::string script = "{ sleep 0.1; $tool --wait 5 put b 2; " + lines +
                                   "; } | $tool " + verb + " > /dev/null";
        const ChildResult result = runInChild([&] {
            setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
            setenv("KORVEX_DB", dir.file("db").c_str(), 1);
            setenv("tool", KORVEX_RECORDS, 1);
            execl("/bin/sh", "sh", "-c", script.c_str(), nullptr);
            return 127;
        });
        EXPECT_EQ(result.status, 0) << verb;
        EXPECT_EQ(result.err, "") << verb;
        EXPECT_EQ(run({"get", "b"}).out, "2") << verb;
    }
}

TEST_F(WritingTest, AFileOfAnotherVersionIsRefusedUnlessItIsMeant) {
    const std::string other = recordBytes("_record-file-version", "3.0") + recordBytes("a", "1");
    writeFile(data, other);
    EXPECT_EQ(run({"get", "a"}).out, "1");
    expectRefused({"put", "b", "2"}, data +
                                         ": its version is \"3.0\", not \"2.0\"; not written "
                                         "without --any-version");
    EXPECT_EQ(stored(), other);
    EXPECT_EQ(run({"salvage", "-o", dir.file("new")}).status, 4);
    EXPECT_FALSE(std::filesystem::exists(dir.file("new")));
    EXPECT_EQ(run({"salvage", "--any-version", "-o", dir.file("new")}).status, 0);
    EXPECT_EQ(readFile(dir.file("new")), before);
    EXPECT_EQ(run({"--any-version", "put", "b", "2"}).status, 0);
    EXPECT_EQ(stored(), after);
    writeFile(data, recordBytes("a", "1"));
    EXPECT_EQ(run({"put", "b", "2"}).status, 0) << "no version is no other one";
    EXPECT_EQ(stored(), after);
}

TEST_F(WritingTest, NamesOf255BytesWorkOnEveryVerb) {
    const std::string file = dir.file(std::string(255, 'n'));
    const std::string copy = dir.file(std::string(255, 'c'));
    EXPECT_EQ(run({"-f", file, "put", "a", "1"}).status, 0);
    EXPECT_EQ(run({"-f", file, "put", "b", "2"}).status, 0);
    EXPECT_EQ(run({"-f", file, "list"}).out, "a\nb\n");
    EXPECT_EQ(run({"-f", file, "get", "b"}).out, "2");
    EXPECT_EQ(run({"-f", file, "stats"}).status, 0);
    EXPECT_EQ(run({"-f", file, "check"}).status, 0);
    EXPECT_EQ(run({"-f", copy, "load"}, run({"-f", file, "dump"}).out).status, 0);
    EXPECT_EQ(run({"-f", file, "diff", copy}).status, 0);
    EXPECT_EQ(run({"-f", file, "batch"}, "remove\ta\n").status, 0);
    EXPECT_EQ(run({"-f", file, "remove", "b"}).status, 0);
    EXPECT_EQ(run({"-f", copy, "salvage", "-o", dir.file(std::string(255, 's'))}).status, 0);
    EXPECT_EQ(readFile(dir.file(std::string(255, 's'))), after);
}

TEST_F(WritingTest, TheFailedCallAndItsReasonAreTold) {
    std::filesystem::remove(data);
    const std::string missing = dir.file("none/data");
    const ChildResult result = run({"-f", missing, "put", "a", "1"});
    EXPECT_EQ(result.status, 4);
    EXPECT_EQ(result.err, "korvex-records: cannot make a file in " + dir.file("none") +
                              ": No such file or directory\n");
    EXPECT_EQ(run({"-f", data + "/x", "list"}).status, 4);
    writeFile(data, before);
    EXPECT_EQ(run({"-f", data + "/x", "list"}).err,
              "korvex-records: cannot look at " + data + "/x: Not a directory\n");
    EXPECT_EQ(run({"put", "-i", missing, "a"}).err,
              "korvex-records: cannot open " + missing + ": No such file or directory\n");
}

// The tool, stopped at each of its system calls' beginnings and ends.
class TracedWriting : public WritingTest {
  protected:
    // Calls `act` at the k-th stop, and goes on if that says so. The status; -1 when it was killed.
    int runWith(int k, const std::vector<std::string>& arguments,
                const std::function<bool()>& act) const {
        const pid_t pid = fork();
        if (pid == 0) {
            setenv("LSAN_OPTIONS", "detect_leaks=0", 1);  // that needs ptrace for itself
            ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
            dup2(open("/dev/null", O_RDWR), 2);
            dup2(open("/dev/null", O_RDWR), 1);
            execTool(arguments);
        }
        int status = 0;
        while (waitpid(pid, &status, 0) == pid && WIFSTOPPED(status)) {
            if (--k == 0 && !act()) kill(pid, SIGKILL);
            ptrace(PTRACE_SYSCALL, pid, nullptr, nullptr);
        }
        _ended = k > 0;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    // Whether the last run came to its end before its k-th stop.
    bool ended() const { return _ended; }

  private:
    mutable bool _ended = false;
};

TEST_F(TracedWriting, AFirstWriterThatIsKilledLeavesNoFileOrAWholeOneAndTheNextRunWrites) {
    if (isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    bool sawNone = false;
    bool sawLinked = false;
    for (int k = 1;; ++k) {
        // Sweeping takes calls, too, by which stops would be missed.
        for (const std::string& name : beside())
            std::filesystem::remove(beside(name));
        runWith(k, {"put", "a", "1"}, [] { return false; });
        if (ended()) break;
        const bool isThere = std::filesystem::exists(data);
        sawNone = sawNone || !isThere;
        sawLinked = sawLinked || (isThere && beside().size() == 2);
        if (isThere) {
            ASSERT_EQ(stored(), before) << k;
        }
        if (k % 8 == 0 || (isThere && beside().size() > 1)) {
            ASSERT_EQ(run({"put", "b", "2"}).status, 0) << k;
            ASSERT_THAT(beside(), ElementsAre("data")) << k;
            ASSERT_EQ(stored(), isThere ? after : fileOf({{"b", "2"}})) << k;
        }
    }
    EXPECT_TRUE(sawNone);
    EXPECT_TRUE(sawLinked);
    EXPECT_EQ(stored(), before);
}

TEST_F(TracedWriting, AnotherFirstWriterMayMakeTheDirectoryMeanwhile) {
    if (isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    const std::string hashDb = dir.file("db/hashDb");
    int made = 0;
    for (int k = 1;; ++k) {
        std::filesystem::remove_all(hashDb);
        const int status = runWith(k, {"--create", "put", "a", "1"}, [&] {
            made += std::filesystem::create_directory(hashDb) ? 1 : 0;
            return true;
        });
        if (ended()) break;
        ASSERT_EQ(status, 0) << k;
        ASSERT_EQ(stored(), before) << k;
    }
    EXPECT_GT(made, 10);
}

TEST_F(TracedWriting, WhatAnotherProgramWritesMeanwhileIsNotOverwritten) {
    if (isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    const std::string theirs = fileOf({{"a", "1"}, {"server", "wrote"}});
    int refused = 0;
    for (int k = 1;; k += 3) {
        writeFile(data, before);
        const int status = runWith(k, {"put", "b", "2"}, [&] {
            // In place, as the library saves.
            if (stored() == before) writeFile(data, theirs);
            return true;
        });
        if (ended()) break;
        if (status != 4) continue;
        ++refused;
        ASSERT_EQ(stored(), theirs) << k;
    }
    EXPECT_GT(refused, 10);
}

TEST_F(TracedWriting, AModeThatIsSetMeanwhileIsNotSetBack) {
    if (isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    int refused = 0;
    for (int k = 1;; k += 3) {
        writeFile(data, before);
        ASSERT_EQ(chmod(data.c_str(), 0600), 0);
        const int status =
            runWith(k, {"put", "b", "2"}, [&] { return chmod(data.c_str(), 0640) == 0; });
        if (ended()) break;
        if (status != 4) continue;
        ++refused;
        struct stat st {};
        ASSERT_EQ(stat(data.c_str(), &st), 0);
        ASSERT_EQ(st.st_mode & 07777U, 0640U) << k;
        ASSERT_EQ(stored(), before) << k;
    }
    EXPECT_GT(refused, 10);
}

}  // namespace
