#include <korvex/util/Logger.h>

#include <gmock/gmock.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <string>

#include "support/LogFiles.h"
#include "tools/RecordsTool.h"

// A small file system of its own, for real. Each test runs in a child, whose mount goes with it.

namespace {

using namespace testsupport;

constexpr int kCannotMount = 77;

bool mountSmallDisk(const std::string& at) {
    return unshare(CLONE_NEWNS) == 0 &&
           mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           mount("korvex-test", at.c_str(), "tmpfs", 0, "size=64k") == 0;
}

// Leaves no room at all.
void fill(const std::string& file) {
    std::FILE* const out = std::fopen(file.c_str(), "wb");
    std::setbuf(out, nullptr);
    while (std::fputc('x', out) != EOF) {
    }
    std::fclose(out);
}

std::size_t countOf(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = 0; (at = text.find(what, at)) != text.npos; at += what.size())
        ++count;
    return count;
}

class FullDiskTest : public RecordsToolTest {
  protected:
    void onASmallDisk(const std::string& at, const std::function<void()>& body) {
        const ChildResult result = runInChild([&] {
            if (!mountSmallDisk(at)) return kCannotMount;
            body();
            return HasFailure() ? 1 : 0;
        });
        if (result.status == kCannotMount)
            GTEST_SKIP() << "no mounting here; see also RLIMIT_FSIZE";
        EXPECT_EQ(result.status, 0) << result.signal << result.out << result.err;
    }
};

TEST_F(FullDiskTest, LoggingReportsEachLostLineOnceAndResumesWhenThereIsRoom) {
    const std::string disk = dir.file("db");
    onASmallDisk(disk, [&] {
        writeFile(dir.file("conf"),
                  "appender.A=File\nappender.A.fileName=" + disk + "/log\nrootCategory=INFO,A\n");
        Logger::initialize(Pathname(dir.file("conf")), Pathname());
        Logger logger("test");
        logger.info("before");
        fill(disk + "/filler");
        const std::string line(5000, 'l');  // more than is left of the file's last page
        for (int n = 0; n < 20; ++n)
            logger.info(line);
        const std::string told = ownStderr();
        EXPECT_EQ(countOf(told, "\n"), 20U);
        EXPECT_EQ(countOf(told, "Error writing to \"" + disk + "/log\": No space left on device"),
                  20U);
        Pathname(disk + "/filler").unlink();
        logger.info("after");
        EXPECT_EQ(ownStderr(), told);
        const auto lines = linesOf(disk + "/log");
        EXPECT_EQ(lines.front(), "before");
        EXPECT_NE(lines.back().find("after"), std::string::npos);
    });
}

TEST_F(FullDiskTest, TheToolSaysSoAndKeepsWhatThereWas) {
    onASmallDisk(dir.file("db"), [&] {
        std::filesystem::create_directories(dir.file("db/hashDb"));
        EXPECT_EQ(run({"put", "a", std::string(3000, 'a')}).status, 0);
        const std::string before = stored();
        fill(dir.file("db/filler"));
        const ChildResult put = run({"put", "b", std::string(9000, 'b')});
        EXPECT_EQ(put.status, 4);
        EXPECT_NE(put.err.find("No space left on device"), std::string::npos) << put.err;
        EXPECT_EQ(run({"remove", "a"}).status, 4);
        EXPECT_EQ(stored(), before);
        EXPECT_EQ(run({"check"}).status, 0);
        Pathname(dir.file("db/filler")).unlink();
        EXPECT_EQ(run({"put", "b", std::string(9000, 'b')}).status, 0);
        EXPECT_EQ(run({"get", "a"}).out, std::string(3000, 'a'));
    });
}

}  // namespace
