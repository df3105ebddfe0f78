#include "util/Logger/Rotation.h"

#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <cerrno>
#include <initializer_list>
#include <set>
#include <string>

#include "support/Child.h"
#include "support/Faults.h"
#include "support/TempDir.h"

namespace {

using testing::ElementsAre;
using testsupport::Call;
using testsupport::FailNth;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::writeFile;

TEST(FirstGapTest, IsTheFirstNumberThatIsFree) {
    const auto gap = [](unsigned limit, std::set<unsigned> taken) {
        return firstGap(limit, [&](unsigned k) { return taken.count(k) != 0; });
    };
    EXPECT_EQ(gap(0, {0, 1}), 0U);
    EXPECT_EQ(gap(3, {}), 0U);
    EXPECT_EQ(gap(3, {0, 2}), 1U);
    EXPECT_EQ(gap(3, {0, 1}), 2U);
    EXPECT_EQ(gap(3, {0, 1, 2}), 3U);
    EXPECT_EQ(gap(3, {0, 1, 2, 3, 4}), 3U);
}

class RotationTest : public testing::Test {
  protected:
    RotationTest() { _appender.setAttribute("fileName", _dir.file("app.log").c_str(), Pathname()); }

    void limits(const char* size, const char* backups) {
        EXPECT_TRUE(_appender.setAttribute("maxFileSize", size, Pathname()));
        EXPECT_TRUE(_appender.setAttribute("maxBackupIndex", backups, Pathname()));
    }
    void haveFiles(std::initializer_list<const char*> names) {
        for (const char* name : names)
            writeFile(_dir.file(name), std::string("old ") + name);
    }
    // One message whose line has `size` bytes.
    void log(char c, std::size_t size) {
        _appender.write(LogMsgMetadata(&_logger, INFO), std::string(size - 1, c));
    }
    std::string content(const char* name) { return readFile(_dir.file(name)); }
    static std::string line(char c, std::size_t size) { return std::string(size - 1, c) + "\n"; }

    TempDir _dir;
    Logger _logger{"Foo"};
    LogAppender _appender;
};

TEST_F(RotationTest, TheLimitIsPassedStrictlyAndCheckedAfterTheWrite) {
    limits("100", "2");
    log('a', 99);
    log('b', 1);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log")) << "exactly 100 bytes stay";
    log('c', 1);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1"));
    EXPECT_EQ(content("app.log"), "");
    EXPECT_EQ(content("app.log.1").size(), 101U);
}

TEST_F(RotationTest, ThreeRotationsWithTwoBackups) {
    limits("100", "2");
    log('1', 150);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1"));
    log('2', 150);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1", "app.log.2"));
    log('3', 150);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1", "app.log.2"));
    EXPECT_EQ(content("app.log"), "");
    EXPECT_EQ(content("app.log.1"), line('3', 150));
    EXPECT_EQ(content("app.log.2"), line('2', 150));
}

TEST_F(RotationTest, AGapAtOneLeavesBackupTwoAlone) {
    limits("10", "5");
    haveFiles({"app.log.2"});
    log('x', 11);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1", "app.log.2"));
    EXPECT_EQ(content("app.log.2"), "old app.log.2");
    EXPECT_EQ(content("app.log.1"), line('x', 11));
}

TEST_F(RotationTest, AGapInTheMiddleIsFilled) {
    limits("10", "5");
    haveFiles({"app.log.1", "app.log.2", "app.log.4"});
    log('x', 11);
    EXPECT_EQ(content("app.log.1"), line('x', 11));
    EXPECT_EQ(content("app.log.2"), "old app.log.1");
    EXPECT_EQ(content("app.log.3"), "old app.log.2");
    EXPECT_EQ(content("app.log.4"), "old app.log.4");
}

TEST_F(RotationTest, TheOldestGoesAndWhatLiesBeyondIsNotTouched) {
    limits("10", "2");
    haveFiles({"app.log.1", "app.log.2", "app.log.3"});
    log('x', 11);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1", "app.log.2", "app.log.3"));
    EXPECT_EQ(content("app.log.2"), "old app.log.1");
    EXPECT_EQ(content("app.log.3"), "old app.log.3");
}

TEST_F(RotationTest, WithoutBackupsTheFileStartsAgainEmpty) {
    limits("10", "0");
    haveFiles({"app.log.1"});
    log('x', 11);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1"));
    EXPECT_EQ(content("app.log"), "");
    EXPECT_EQ(content("app.log.1"), "old app.log.1");
    log('y', 5);
    EXPECT_EQ(content("app.log"), line('y', 5));
}

TEST_F(RotationTest, ALimitOfZeroNeverRotates) {
    limits("0", "2");
    log('x', 100000);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log"));
}

TEST_F(RotationTest, ALimitBeyondTheSignedRangeNeverRotates) {
    limits("18446744073709551615", "2");
    log('x', 1000);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log"));
}

TEST_F(RotationTest, WhatTheFileHeldBeforeCounts) {
    limits("100", "2");
    writeFile(_dir.file("app.log"), std::string(95, 'o'));
    log('x', 6);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1"));
    EXPECT_EQ(content("app.log.1").size(), 101U);
}

TEST_F(RotationTest, ABackupIndexBeyond32BitsIsTheLargest) {
    limits("10", "4294967296");
    log('x', 11);
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log.1")) << "not wrapped to no backups";
}

TEST_F(RotationTest, AFileThatCannotBeOpenedAfterARotationIsTriedAgain) {
    limits("10", "1");
    const auto result = runInChild([&] {
        const FailNth fault(Call::open, 2, EMFILE);
        log('x', 11);
        if (!fault.fired()) return 1;
        log('y', 5);
        return 0;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "Error opening \"" + _dir.file("app.log") + "\": Too many open files\n");
    EXPECT_EQ(content("app.log"), line('y', 5));
    EXPECT_EQ(content("app.log.1"), line('x', 11));
}

TEST_F(RotationTest, AFailingRenameLosesNothing) {
    limits("10", "1");
    log('w', 5);
    {
        const FailNth fault(Call::rename, 1, EACCES);
        log('x', 6);
        EXPECT_TRUE(fault.fired());
    }
    EXPECT_EQ(content("app.log"), line('w', 5) + line('x', 6));
    log('y', 5);
    EXPECT_EQ(content("app.log.1"), line('w', 5) + line('x', 6) + line('y', 5));
}

}  // namespace
