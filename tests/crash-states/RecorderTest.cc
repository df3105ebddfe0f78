#include "crash-states/Recorder.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cstdio>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "support/TempDir.h"
#include "tools/ExecTool.h"

namespace {

using namespace crashstates;
using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::TempDir;

class RecorderTest : public testing::Test {
  protected:
    void SetUp() override {
        if (testsupport::isEmulated()) GTEST_SKIP() << "the emulator has no ptrace";
    }
    std::string file(const std::string& name) const { return _dir.file(name); }
    Recording recordBody(const std::function<void()>& body) const {
        return record(_dir.path(), [&] {
            body();
            return 0;
        });
    }
    // The events as told.
    std::vector<std::string> events(const std::function<void()>& body) const {
        std::vector<std::string> all;
        for (const Event& event : recordBody(body).history.events)
            all.push_back(describe(event));
        return all;
    }

    const TempDir _dir;
};

TEST_F(RecorderTest, NothingDoneIsNothingRecorded) {
    testsupport::writeFile(file("a"), "x");
    const Recording recording = record(_dir.path(), [] { return 7; });
    EXPECT_EQ(recording.status, 7);
    EXPECT_THAT(recording.history.events, IsEmpty());
    EXPECT_EQ(recording.history.before.files.at(recording.history.before.names.at("a")).bytes, "x");
}

TEST_F(RecorderTest, WritesAreRecordedWithTheirPlaceAndBytes) {
    const Recording recording = recordBody([&] {
        const int fd = open(file("a").c_str(), O_CREAT | O_WRONLY, 0640);
        static_cast<void>(!write(fd, "one\0two", 7));
        iovec pieces[] = {{const_cast<char*>("3"), 1}, {const_cast<char*>("44"), 2}};
        static_cast<void>(!writev(fd, pieces, 2));
        static_cast<void>(!pwrite(fd, "P", 1, 2));
        static_cast<void>(!write(fd, "", 0));
        close(fd);
    });
    const auto& events = recording.history.events;
    ASSERT_EQ(events.size(), 4U);
    EXPECT_EQ(std::get<Create>(events[0]).name, "a");
    EXPECT_EQ(std::get<Create>(events[0]).attributes.at("mode"), "0640");
    EXPECT_EQ(std::get<Write>(events[1]).bytes, std::string("one\0two", 7));
    EXPECT_EQ(std::get<Write>(events[1]).offset, 0U);
    EXPECT_EQ(std::get<Write>(events[2]).bytes, "344");
    EXPECT_EQ(std::get<Write>(events[2]).offset, 7U);
    EXPECT_EQ(std::get<Write>(events[3]).bytes, "P");
    EXPECT_EQ(std::get<Write>(events[3]).offset, 2U);
}

TEST_F(RecorderTest, AppendsGoToTheEnd) {
    testsupport::writeFile(file("a"), "12345");
    EXPECT_THAT(events([&] {
                    const int fd = open(file("a").c_str(), O_WRONLY | O_APPEND);
                    static_cast<void>(!write(fd, "xy", 2));
                }),
                ElementsAre("write 2 bytes at 5 of file 1"));
}

TEST_F(RecorderTest, OpeningEmptiesAFileOrLeavesIt) {
    testsupport::writeFile(file("a"), "12345");
    testsupport::writeFile(file("empty"), "");
    EXPECT_THAT(events([&] {
                    open(file("a").c_str(), O_RDONLY);
                    open(file("a").c_str(), O_CREAT | O_WRONLY, 0600);
                    open(file("empty").c_str(), O_TRUNC | O_WRONLY);
                    const int fd = open(file("a").c_str(), O_WRONLY | O_TRUNC);
                    static_cast<void>(!ftruncate(fd, 10));
                    creat(file("a").c_str(), 0600);
                }),
                ElementsAre(testing::MatchesRegex("truncate file [12] to 0"),
                            testing::MatchesRegex("truncate file [12] to 10"),
                            testing::MatchesRegex("truncate file [12] to 0")));
}

TEST_F(RecorderTest, NamesAndSyncsAreRecordedHoweverTheyAreSaid) {
    EXPECT_THAT(
        events([&] {
            const int dir = open(_dir.path().c_str(), O_RDONLY);
            static_cast<void>(!chdir(_dir.path().c_str()));
            const int fd = openat(dir, "new", O_CREAT | O_EXCL | O_WRONLY, 0600);
            fsync(dup(fd));
            fdatasync(fd);
            static_cast<void>(!link("new", "./second"));
            const std::string self = "/proc/self/fd/" + std::to_string(fd);
            linkat(AT_FDCWD, self.c_str(), dir, "third", AT_SYMLINK_FOLLOW);
            fsync(dir);
            std::rename("new", file("renamed").c_str());
            renameat(dir, "second", AT_FDCWD, "renamed too");
            unlink("third");
            unlinkat(dir, "renamed too", 0);
            fsync(open("/proc", O_RDONLY));
        }),
        ElementsAre("create \"new\" as file 1", "fsync file 1", "fdatasync file 1",
                    "link file 1 to \"second\"", "link file 1 to \"third\"", "fsync the directory",
                    "rename \"new\" to \"renamed\"", "rename \"second\" to \"renamed too\"",
                    "unlink \"third\"", "unlink \"renamed too\""));
}

TEST_F(RecorderTest, AFileWithoutANameGetsOneByALink) {
    EXPECT_THAT(events([&] {
                    const int fd = open(_dir.path().c_str(), O_TMPFILE | O_WRONLY, 0600);
                    if (fd < 0) _exit(1);
                    static_cast<void>(!write(fd, "x", 1));
                    const std::string self = "/dev/fd/" + std::to_string(fd);
                    linkat(AT_FDCWD, self.c_str(), AT_FDCWD, file("a").c_str(), AT_SYMLINK_FOLLOW);
                }),
                ElementsAre("create \"\" as file 1", "write 1 bytes at 0 of file 1",
                            "link file 1 to \"a\""));
}

TEST_F(RecorderTest, ANumberThatTheFileSystemUsesAgainIsANewFile) {
    EXPECT_THAT(events([&] {
                    close(creat(file("a").c_str(), 0600));
                    unlink(file("a").c_str());
                    close(creat(file("b").c_str(), 0600));
                    unlink(file("b").c_str());
                }),
                ElementsAre("create \"a\" as file 1", "unlink \"a\"", "create \"b\" as file 2",
                            "unlink \"b\""));
}

TEST_F(RecorderTest, AttributesAreRecordedWhenTheyChange) {
    testsupport::writeFile(file("a"), "");
    chmod(file("a").c_str(), 0644);
    const Recording recording = recordBody([&] {
        const int fd = open(file("a").c_str(), O_RDONLY);
        fchmod(fd, 0644);
        fchmod(fd, 0600);
        if (fsetxattr(fd, "user.test", "1", 1, 0) != 0) _exit(1);
        removexattr(("/proc/self/fd/" + std::to_string(fd)).c_str(), "user.test");
        chmod(file("a").c_str(), 0640);
    });
    ASSERT_EQ(recording.status, 0) << "no extended attributes here";
    std::vector<std::string> changes;
    for (const Event& event : recording.history.events) {
        const auto& change = std::get<SetAttribute>(event);
        changes.push_back(change.name + "=" + change.value.value_or("(none)"));
    }
    EXPECT_THAT(changes, ElementsAre("mode=0600", "user.test=1", "user.test=(none)", "mode=0640"));
}

TEST_F(RecorderTest, FailedCallsAndOtherDirectoriesAreNotRecorded) {
    const TempDir other;
    EXPECT_THAT(events([&] {
                    open(file("missing").c_str(), O_RDONLY);
                    std::rename(file("missing").c_str(), file("b").c_str());
                    const int fd = creat(other.file("a").c_str(), 0600);
                    static_cast<void>(!write(fd, "x", 1));
                    fsync(fd);
                    unlink(other.file("a").c_str());
                }),
                IsEmpty());
}

TEST_F(RecorderTest, ThreadsAreFollowed) {
    EXPECT_THAT(events([&] { std::thread([&] { close(creat(file("a").c_str(), 0600)); }).join(); }),
                ElementsAre("create \"a\" as file 1"));
}

TEST_F(RecorderTest, WhatCannotBeRecordedIsTold) {
    testsupport::writeFile(file("a"), "x");
    EXPECT_THROW(recordBody([&] {
                     const int fd = open(file("a").c_str(), O_RDWR);
                     void* const p = mmap(nullptr, 1, PROT_WRITE, MAP_SHARED, fd, 0);
                     *static_cast<char*>(p) = 'y';
                 }),
                 std::runtime_error);
    const TempDir other;
    EXPECT_THROW(recordBody([&] { std::rename(file("a").c_str(), other.file("a").c_str()); }),
                 std::runtime_error);
    testsupport::writeFile(file("a"), "x");
    EXPECT_THROW(recordBody([&] {
                     std::rename(file("a").c_str(), other.file("a").c_str());
                     std::rename(other.file("a").c_str(), file("b").c_str());
                 }),
                 std::runtime_error);
    EXPECT_THROW(recordBody([&] { mkdir(file("sub").c_str(), 0700); }), std::runtime_error);
}

TEST_F(RecorderTest, AChildThatIsKilledIsTold) {
    EXPECT_THROW(recordBody([] { raise(SIGKILL); }), std::runtime_error);
}

}  // namespace
