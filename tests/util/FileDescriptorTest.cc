#include <korvex/util/FileDescriptor.h>

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <stdexcept>
#include <string>
#include <utility>

#include "support/Faults.h"
#include "support/TempDir.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::Call;
using testsupport::CountCalls;
using testsupport::FailNth;
using testsupport::readFile;
using testsupport::ShiftNth;
using testsupport::ShortNth;
using testsupport::TempDir;
using testsupport::writeFile;

class FileDescriptorTest : public testing::Test {
  protected:
    ~FileDescriptorTest() override { umask(_umask); }

    Pathname path(const char* name) const { return Pathname(_dir.file(name)); }
    // A descriptor that the test closes at its end.
    FileDescriptor keep(FileDescriptor fd) {
        EXPECT_TRUE(fd.valid());
        return fd;
    }
    static mode_t modeOf(const Pathname& file) {
        struct stat st {};
        EXPECT_TRUE(file.stat(&st));
        return st.st_mode & 07777;
    }
    static bool isOpen(int fd) { return ::fcntl(fd, F_GETFD) != -1; }
    static int flagsOf(const FileDescriptor& fd) { return ::fcntl(fd.osdep(), F_GETFL); }

    TempDir _dir;
    const mode_t _umask = umask(022);
};

TEST_F(FileDescriptorTest, ThereIsNoneAtFirst) {
    EXPECT_FALSE(FileDescriptor().valid());
    EXPECT_EQ(FileDescriptor().osdep(), -1);
    EXPECT_TRUE(FileDescriptor(0).valid());
    EXPECT_FALSE(FileDescriptor(-7).valid());
}

TEST_F(FileDescriptorTest, EachOpenHasItsFlags) {
    writeFile(path("f"), "old");
    const auto check = [](FileDescriptor fd, int access, int others) {
        EXPECT_EQ(flagsOf(fd) & O_ACCMODE, access);
        EXPECT_EQ(flagsOf(fd) & (O_NONBLOCK | O_APPEND), others);
        EXPECT_EQ(::fcntl(fd.osdep(), F_GETFD) & FD_CLOEXEC, 0);
        fd.close();
    };
    check(path("f").openReadOnly(), O_RDONLY, 0);
    check(path("f").openReadOnlySafer(), O_RDONLY, O_NONBLOCK);
    check(path("f").openCreateOrAppend(Pathname::CREATE_NORMAL), O_WRONLY, O_APPEND);
    EXPECT_EQ(readFile(path("f")), "old");
    check(path("f").openCreateOrReplace(Pathname::CREATE_NORMAL), O_WRONLY, 0);
    EXPECT_EQ(readFile(path("f")), "");
    writeFile(path("f"), "old");
    check(path("f").openReadWriteOrCreate(Pathname::CREATE_NORMAL), O_RDWR, 0);
    EXPECT_EQ(readFile(path("f")), "") << "it empties the file, whatever its name promises";
    check(path("new").openCreateOnly(Pathname::CREATE_NORMAL), O_WRONLY, 0);
}

TEST_F(FileDescriptorTest, CreateOnlyRefusesAFileThatIsThere) {
    writeFile(path("f"), "old");
    errno = 0;
    EXPECT_FALSE(path("f").openCreateOnly(Pathname::CREATE_NORMAL).valid());
    EXPECT_EQ(errno, EEXIST);
    EXPECT_EQ(readFile(path("f")), "old");
}

TEST_F(FileDescriptorTest, ReadingOpensCreateNothing) {
    errno = 0;
    EXPECT_FALSE(path("f").openReadOnly().valid());
    EXPECT_FALSE(path("f").openReadOnlySafer().valid());
    EXPECT_EQ(errno, ENOENT);
    EXPECT_THAT(_dir.names(), IsEmpty());
}

TEST_F(FileDescriptorTest, ASaferOpenDoesNotWaitForAPeer) {
    ASSERT_EQ(mkfifo(path("fifo").c_str(), 0600), 0);
    const ScopedSaferFileDescriptor fd(path("fifo"));
    EXPECT_TRUE(fd.valid());
}

TEST_F(FileDescriptorTest, CreateModes) {
    using Open = FileDescriptor (Pathname::*)(Pathname::CreateMode) const;
    const Open opens[] = {&Pathname::openCreateOnly, &Pathname::openCreateOrReplace,
                          &Pathname::openCreateOrAppend, &Pathname::openReadWriteOrCreate};
    const std::pair<int, mode_t> modes[] = {{0, 0644}, {1, 0600}, {2, 0440}, {3, 0644}, {-1, 0644}};
    for (const Open open : opens) {
        for (const auto& [preset, bits] : modes) {
            FileDescriptor fd = (path("f").*open)(static_cast<Pathname::CreateMode>(preset));
            EXPECT_TRUE(fd.close());
            EXPECT_EQ(modeOf(path("f")), bits) << preset;
            path("f").unlink();
        }
    }
    umask(077);
    path("f").openCreateOrAppend(Pathname::CREATE_NORMAL).close();
    EXPECT_EQ(modeOf(path("f")), 0600U) << "the umask applies";
}

TEST_F(FileDescriptorTest, AModelGivesItsPermissionBits) {
    writeFile(path("model"), "");
    ASSERT_EQ(chmod(path("model").c_str(), 04750), 0);
    const ScopedFileDescriptor model(path("model"));
    umask(0);
    path("f").openCreateOrReplace(model).close();
    EXPECT_EQ(modeOf(path("f")), 0750U);
    errno = 0;
    EXPECT_FALSE(path("g").openCreateOrReplace(FileDescriptor()).valid());
    EXPECT_EQ(errno, EBADF);
    EXPECT_FALSE(path("g").exists());
}

TEST_F(FileDescriptorTest, ReadFillsTheBufferAsFarAsPossible) {
    writeFile(path("f"), std::string(40, 'x'));
    const ScopedFileDescriptor fd(path("f"));
    char buf[100];
    EXPECT_EQ(fd.read(buf, 0), 0);
    EXPECT_EQ(fd.read(buf, 100), 40);
    EXPECT_EQ(fd.read(buf, 100), 0);
}

TEST_F(FileDescriptorTest, ReadGoesOnAfterShortCountsAndInterruptions) {
    writeFile(path("f"), "0123456789");
    const ScopedFileDescriptor fd(path("f"));
    char buf[11] = {};
    errno = 7;
    {
        const ShortNth fault(Call::read, 1, 3);
        EXPECT_EQ(fd.read(buf, 10), 10);
        EXPECT_EQ(fault.count(), 2U);
    }
    EXPECT_STREQ(buf, "0123456789");
    EXPECT_TRUE(fd.seek_set(0));
    const FailNth fault(Call::read, 1, EINTR);
    EXPECT_EQ(fd.read(buf, 10), 10);
    EXPECT_TRUE(fault.fired());
    EXPECT_EQ(errno, 7) << "success leaves errno alone";
}

TEST_F(FileDescriptorTest, AnErrorAfterSomeDataIsAShortCount) {
    writeFile(path("f"), "0123456789");
    const ScopedFileDescriptor fd(path("f"));
    char buf[20];
    errno = 0;
    const FailNth fault(Call::read, 2, EIO);
    EXPECT_EQ(fd.read(buf, 20), 10);
    EXPECT_EQ(errno, EIO);
}

TEST_F(FileDescriptorTest, AnErrorAtOnceIsTold) {
    char c = 'x';
    errno = 0;
    EXPECT_EQ(FileDescriptor().read(&c, 1), -1);
    EXPECT_EQ(errno, EBADF);
    errno = 0;
    EXPECT_EQ(FileDescriptor().write(&c, 1), -1);
    EXPECT_EQ(errno, EBADF);
}

TEST_F(FileDescriptorTest, AZeroLengthCallStillCalls) {
    const CountCalls reads(Call::read);
    const CountCalls writes(Call::write);
    EXPECT_EQ(FileDescriptor().read(nullptr, 0), -1);
    EXPECT_EQ(FileDescriptor().write(nullptr, 0), -1);
    EXPECT_EQ(reads.count() + writes.count(), 2U);
}

TEST_F(FileDescriptorTest, WriteGoesOnAfterShortCountsAndInterruptions) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    {
        const ShortNth fault(Call::write, 1, 3);
        EXPECT_EQ(fd.write("0123456789", 10), 10);
        EXPECT_EQ(fault.count(), 2U);
    }
    {
        const FailNth fault(Call::write, 1, EINTR);
        EXPECT_EQ(fd.write("ab", 2), 2);
    }
    {
        const ShortNth nothing(Call::write, 1, 0);
        EXPECT_EQ(fd.write("ab", 2), 0);
    }
    EXPECT_TRUE(fd.close());
    EXPECT_EQ(readFile(path("f")), "0123456789ab");
}

TEST_F(FileDescriptorTest, ATransferBeyondIntMaxIsAShortCount) {
    const unsigned long size = (1UL << 31) + 10;
    std::string big;
    try {
        big.resize(size);
    } catch (const std::bad_alloc&) {
        GTEST_SKIP() << "not enough memory";
    } catch (const std::length_error&) {
        GTEST_SKIP() << "no string is that long on this machine";
    }
    FileDescriptor null = Pathname("/dev/null").openCreateOrAppend(Pathname::CREATE_NORMAL);
    EXPECT_EQ(null.write(big.data(), size), 2147483647);
    null.close();
}

TEST_F(FileDescriptorTest, WritevIsOneCall) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    char a[] = "ab";
    char b[] = "cde";
    const struct iovec vec[] = {{a, 2}, {b, 3}};
    EXPECT_EQ(fd.writev(vec, 2), 5);
    const FailNth fault(Call::writev, 1, EINTR);
    EXPECT_EQ(fd.writev(vec, 2), -1);
    EXPECT_EQ(fault.count(), 1U);
    fd.close();
    EXPECT_EQ(readFile(path("f")), "abcde");
}

TEST_F(FileDescriptorTest, FormatWritesTheWholeText) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    std::string expected;
    for (const std::size_t n : {0U, 1U, 255U, 256U, 257U, 1000U}) {
        const std::string text(n, 'x');
        fd.format("%s%d", text.c_str(), 7);
        expected += text + "7";
    }
    fd.close();
    EXPECT_EQ(readFile(path("f")), expected);
}

TEST_F(FileDescriptorTest, AConversionThatFailsWritesNothing) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const wchar_t unconvertible[] = {static_cast<wchar_t>(0x7fffffff), 0};
    const CountCalls writes(Call::write);
    fd.format("a%ls", unconvertible);
    EXPECT_EQ(writes.count(), 0U);
    fd.close();
}

TEST_F(FileDescriptorTest, ALongTextThatFindsNoMemoryWritesNothing) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const std::string text(1000, 'x');
    const CountCalls writes(Call::write);
    const FailNth fault(Call::new_array, 1, ENOMEM);
    errno = 0;
    fd.format("%s", text.c_str());
    EXPECT_EQ(errno, ENOMEM);
    EXPECT_EQ(writes.count(), 0U);
    fd.close();
}

TEST_F(FileDescriptorTest, CloseOnExecIsSetOnceAndCleared) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const CountCalls calls(Call::fcntl);
    EXPECT_EQ(fd.setCloseOnExec(false), 0);
    EXPECT_EQ(calls.count(), 1U);
    EXPECT_EQ(fd.setCloseOnExec(true), 0);
    EXPECT_EQ(calls.count(), 3U);
    EXPECT_EQ(::fcntl(fd.osdep(), F_GETFD), FD_CLOEXEC);
    const auto before = calls.count();
    EXPECT_EQ(fd.setCloseOnExec(true), 0) << "the flags without the bit";
    EXPECT_EQ(calls.count(), before + 1);
    EXPECT_EQ(fd.setCloseOnExec(false), 0);
    EXPECT_EQ(::fcntl(fd.osdep(), F_GETFD), 0);
    fd.close();
    EXPECT_EQ(fd.setCloseOnExec(true), -1);
}

TEST_F(FileDescriptorTest, SizeSeekAndPosition) {
    FileDescriptor fd = path("f").openReadWriteOrCreate(Pathname::CREATE_NORMAL);
    EXPECT_EQ(fd.write("0123456789", 10), 10);
    long long size = 0;
    EXPECT_TRUE(fd.getSize(&size));
    EXPECT_EQ(size, 10);
    EXPECT_EQ(fd.curPos(), 10);
    EXPECT_TRUE(fd.seek_set(4));
    EXPECT_EQ(fd.curPos(), 4);
    EXPECT_EQ(fd.seekEof(), 10);
    const bool wide = sizeof(off_t) == 8;
    errno = 0;
    EXPECT_EQ(fd.seek_set(5LL << 30), wide);
    EXPECT_EQ(errno, wide ? 0 : EOVERFLOW);
    EXPECT_EQ(fd.curPos(), wide ? 5LL << 30 : 10);
    EXPECT_FALSE(fd.seek_set(-1));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(fd.sync(), 0);
    fd.close();
    size = 99;
    EXPECT_FALSE(fd.getSize(&size));
    EXPECT_EQ(size, 99);
    EXPECT_FALSE(fd.seek_set(0));
    EXPECT_EQ(fd.seekEof(), -1);
    EXPECT_EQ(fd.curPos(), -1);
    EXPECT_EQ(fd.sync(), -1);
}

TEST_F(FileDescriptorTest, ClosingTwiceCallsOnce) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const CountCalls closes(Call::close);
    EXPECT_TRUE(fd.close());
    EXPECT_TRUE(fd.close());
    EXPECT_EQ(closes.count(), 1U);
    EXPECT_EQ(fd.osdep(), -1);
}

TEST_F(FileDescriptorTest, AFailingCloseGivesTheNumberUpToo) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const FailNth fault(Call::close, 1, EIO);
    EXPECT_FALSE(fd.close());
    EXPECT_EQ(errno, EIO);
    EXPECT_FALSE(fd.valid());
}

TEST_F(FileDescriptorTest, CloseSavingErrnoKeepsIt) {
    FileDescriptor fd = path("f").openCreateOnly(Pathname::CREATE_NORMAL);
    const FailNth fault(Call::close, 1, EIO);
    errno = 7;
    fd.close_saveErrno();
    EXPECT_TRUE(fault.fired());
    EXPECT_EQ(errno, 7);
}

TEST_F(FileDescriptorTest, AScopedDescriptorClosesItself) {
    writeFile(path("f"), "");
    int number = -1;
    {
        const ScopedFileDescriptor fd(path("f"));
        number = fd.osdep();
        EXPECT_TRUE(isOpen(number));
        errno = 7;
    }
    EXPECT_EQ(errno, 7);
    EXPECT_FALSE(isOpen(number));
}

TEST_F(FileDescriptorTest, ASaferScopedDescriptorOpensOrTakesOver) {
    writeFile(path("f"), "");
    int number = -1;
    {
        const ScopedSaferFileDescriptor opened(path("f"));
        EXPECT_NE(flagsOf(opened) & O_NONBLOCK, 0);
        const ScopedSaferFileDescriptor taken(path("f").openReadOnly());
        number = taken.osdep();
        EXPECT_TRUE(isOpen(number));
    }
    EXPECT_FALSE(isOpen(number));
}

TEST_F(FileDescriptorTest, AssigningToAScopedDescriptorClosesTheOldOne) {
    writeFile(path("f"), "");
    ScopedFileDescriptor fd(path("f"));
    const int first = fd.osdep();
    const FileDescriptor second = path("f").openReadOnly();
    fd = second;
    EXPECT_FALSE(isOpen(first));
    EXPECT_EQ(fd.osdep(), second.osdep());
    fd = FileDescriptor();
    EXPECT_FALSE(isOpen(second.osdep()));
}

TEST_F(FileDescriptorTest, AssigningTheSameNumberKeepsItOpen) {
    writeFile(path("f"), "");
    ScopedFileDescriptor fd(path("f"));
    ScopedFileDescriptor& self = fd;
    fd = self;
    EXPECT_TRUE(isOpen(fd.osdep()));
    fd = FileDescriptor(fd.osdep());
    EXPECT_TRUE(isOpen(fd.osdep()));
}

TEST_F(FileDescriptorTest, ASaferOneIsAssignedAsTheOtherIs) {
    writeFile(path("f"), "");
    const CountCalls closes(Call::close);
    {
        ScopedSaferFileDescriptor a(path("f"));
        ScopedSaferFileDescriptor b;
        const int number = a.osdep();
        ScopedSaferFileDescriptor& self = a;
        a = self;
        EXPECT_TRUE(isOpen(a.osdep()));
        b = a;
        EXPECT_FALSE(a.valid());
        EXPECT_EQ(b.osdep(), number);
        b = b.release();
        EXPECT_EQ(b.osdep(), number);
        EXPECT_EQ(closes.count(), 0U);
    }
    EXPECT_EQ(closes.count(), 1U);
}

TEST_F(FileDescriptorTest, AScopedDescriptorHandsOverToAnother) {
    writeFile(path("f"), "");
    const CountCalls closes(Call::close);
    {
        ScopedFileDescriptor a(path("f"));
        ScopedSaferFileDescriptor b;
        b = a;
        EXPECT_FALSE(a.valid());
        EXPECT_TRUE(isOpen(b.osdep()));
    }
    EXPECT_EQ(closes.count(), 1U);
}

TEST_F(FileDescriptorTest, CopiesContentAndPermissionBits) {
    const std::string content(20000, 'c');
    writeFile(path("from"), content);
    ASSERT_EQ(chmod(path("from").c_str(), 0640), 0);
    writeFile(path("to"), std::string(30000, 'o'));
    path("to").unlink();
    EXPECT_TRUE(path("from").copyTo(path("to")));
    EXPECT_EQ(readFile(path("to")), content);
    EXPECT_EQ(modeOf(path("to")), 0640U);
    writeFile(path("to"), std::string(30000, 'o'));
    EXPECT_TRUE(path("from").copyTo(path("to")));
    EXPECT_EQ(readFile(path("to")), content);
}

TEST_F(FileDescriptorTest, ACopyStartsWhereTheDescriptorsAre) {
    writeFile(path("from"), "0123456789");
    const ScopedFileDescriptor from(path("from"));
    EXPECT_TRUE(from.seek_set(4));
    FileDescriptor to = path("to").openCreateOnly(Pathname::CREATE_NORMAL);
    EXPECT_EQ(to.write("ab", 2), 2);
    EXPECT_TRUE(from.copyTo(to));
    to.close();
    EXPECT_EQ(readFile(path("to")), "ab456789");
}

TEST_F(FileDescriptorTest, ACopyOntoItselfIsRefused) {
    writeFile(path("f"), "precious");
    ASSERT_EQ(link(path("f").c_str(), path("hard").c_str()), 0);
    ASSERT_EQ(symlink("f", path("soft").c_str()), 0);
    for (const char* name : {"f", "hard", "soft"}) {
        errno = 0;
        EXPECT_FALSE(path("f").copyTo(path(name))) << name;
        EXPECT_EQ(errno, EINVAL);
    }
    EXPECT_EQ(readFile(path("f")), "precious");
}

TEST_F(FileDescriptorTest, TheSameNumberOnAnotherDeviceIsAnotherFile) {
    writeFile(path("f"), "content");
    const ShiftNth elsewhere(Call::stat, 1, 1);
    EXPECT_TRUE(path("f").copyTo(path("f"))) << "taken for two files";
    EXPECT_TRUE(elsewhere.fired());
    EXPECT_EQ(readFile(path("f")), "") << "it was emptied before it was read";
}

TEST_F(FileDescriptorTest, ACopyThatFailsTellsWhyAndLeaksNothing) {
    writeFile(path("from"), std::string(20000, 'c'));
    const int next = dup(0);
    close(next);
    const auto copy = [&] { return path("from").copyTo(path("to")); };
    {
        const FailNth fault(Call::read, 2, EIO);
        errno = 0;
        EXPECT_FALSE(copy());
        EXPECT_EQ(errno, EIO);
    }
    {
        const FailNth fault(Call::write, 2, EDQUOT);
        const FailNth closing(Call::close, 1, EIO, FailNth::FROM_THEN_ON);
        errno = 0;
        EXPECT_FALSE(copy());
        EXPECT_EQ(errno, EDQUOT) << "kept across both closes";
        EXPECT_EQ(closing.count(), 2U);
    }
    {
        const ShortNth fault(Call::write, 1, 0);
        errno = 0;
        EXPECT_FALSE(copy());
        EXPECT_EQ(errno, ENOSPC);
    }
    errno = 0;
    EXPECT_FALSE(path("missing").copyTo(path("to")));
    EXPECT_EQ(errno, ENOENT);
    EXPECT_FALSE(path("from").copyTo(path("no/such/dir")));
    EXPECT_FALSE(FileDescriptor().copyTo(path("other")));
    EXPECT_FALSE(path("other").exists());
    const int after = dup(0);
    close(after);
    EXPECT_EQ(next, after);
}

}  // namespace
