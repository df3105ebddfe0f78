#include <korvex/util/Logger.h>

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "support/Child.h"
#include "support/Faults.h"
#include "support/TempDir.h"

// Appenders without a configuration file: attributes, writing, identity, failures. Reports of an
// appender's own failures go to standard error, so each test that looks at them runs in a child.

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::Call;
using testsupport::CountCalls;
using testsupport::FailNth;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::ShiftNth;
using testsupport::ShortNth;
using testsupport::TempDir;
using testsupport::writeFile;

class LogAppenderTest : public testing::Test {
  protected:
    LogAppenderTest() : _file(_dir.file("app.log")) {}

    bool set(const char* name, const std::string& value, const char* home = "") {
        return _appender.setAttribute(name, value.c_str(), Pathname(home));
    }
    // Logs at a moment of message time, in seconds.
    void log(const std::string& msg, int at = 1000) {
        LogMsgMetadata md(&_logger, INFO);
        md.stamp = Timeval();
        md.stamp.set(at, 0);
        _appender.write(md, msg);
    }
    std::string content() const { return readFile(_file); }
    // What body writes to standard error.
    template <class Body>
    std::string errOf(Body body) {
        const auto result = runInChild([&] {
            body();
            return 0;
        });
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.out, "");
        return result.err;
    }

    TempDir _dir;
    const std::string _file;
    Logger _logger{"Foo"};
    LogAppender _appender;
};

TEST_F(LogAppenderTest, AFileIsOpenedAtTheFirstMessageOnly) {
    set("fileName", _file);
    EXPECT_THAT(_dir.names(), IsEmpty());
    log("one");
    log("two");
    EXPECT_EQ(content(), "one\ntwo\n");
}

TEST_F(LogAppenderTest, AnExistingFileIsAppendedTo) {
    writeFile(_file, "old\n");
    set("fileName", _file);
    log("new");
    EXPECT_EQ(content(), "old\nnew\n");
}

TEST_F(LogAppenderTest, ALineIsOneWrite) {
    set("fileName", _file);
    log("first");
    const CountCalls writes(Call::write);
    log(std::string(100000, 'x'));
    EXPECT_EQ(writes.count(), 1U);
}

TEST_F(LogAppenderTest, ANewFileHasTheNormalMode) {
    const mode_t old = umask(022);
    set("fileName", _file);
    log("x");
    umask(old);
    struct stat st {};
    ASSERT_EQ(stat(_file.c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 07777, 0644U);
}

TEST_F(LogAppenderTest, TheHomeMarkerIsReplacedWithoutASeparator) {
    EXPECT_TRUE(set("fileName", "${KORVEX_HOME}/app.log", _dir.path().c_str()));
    log("x");
    EXPECT_TRUE(set("fileName", "${KORVEX_HOME}2.log", _file.c_str()));
    log("y");
    EXPECT_TRUE(set("fileName", "${KORVEX_HOME}", _dir.file("whole").c_str()));
    log("z");
    EXPECT_THAT(_dir.names(), ElementsAre("app.log", "app.log2.log", "whole"));
}

TEST_F(LogAppenderTest, OnlyTheExactMarkerInFrontIsReplaced) {
    ASSERT_EQ(chdir(_dir.path().c_str()), 0);
    for (const char* name :
         {"a${KORVEX_HOME}", "${KORVEX_HOM}", "${korvex_home}", "${KORVEX_HOME"}) {
        set("fileName", name, "/nowhere");
        log(name);
    }
    EXPECT_THAT(_dir.names(), testing::UnorderedElementsAre("a${KORVEX_HOME}", "${KORVEX_HOM}",
                                                            "${korvex_home}", "${KORVEX_HOME"));
    ASSERT_EQ(chdir("/"), 0);
}

TEST_F(LogAppenderTest, WithoutAHomeTheMarkerStays) {
    ASSERT_EQ(chdir(_dir.path().c_str()), 0);
    set("fileName", "${KORVEX_HOME}");
    log("x");
    EXPECT_THAT(_dir.names(), ElementsAre("${KORVEX_HOME}"));
    ASSERT_EQ(chdir("/"), 0);
}

TEST_F(LogAppenderTest, ANewFileNameClosesTheOldFile) {
    set("fileName", _file);
    log("old");
    set("fileName", _dir.file("other"));
    log("new");
    EXPECT_EQ(content(), "old\n");
    EXPECT_EQ(readFile(_dir.file("other")), "new\n");
}

TEST_F(LogAppenderTest, NumbersMustBePlainAndUnsigned) {
    for (const char* name : {"maxFileSize", "maxBackupIndex"}) {
        for (const char* good : {"0", "1", "10", "18446744073709551616"}) {
            EXPECT_TRUE(set(name, good)) << name << good;
        }
        for (const char* bad : {"", "010", "10k", "-1", "+1", " 1", "1 ", "0x10"}) {
            EXPECT_FALSE(set(name, bad)) << name << bad;
        }
    }
}

TEST_F(LogAppenderTest, UnknownAttributesAreRefused) {
    for (const char* name : {"", "filename", "fileName ", "layout.", "Layout", "threshold",
                             "layout.conversionPattern", "maxFileSizes"}) {
        EXPECT_FALSE(set(name, "1")) << name;
    }
}

TEST_F(LogAppenderTest, TheNamedLayouts) {
    set("fileName", _file);
    EXPECT_TRUE(set("layout", "SimpleLayout"));
    log("a");
    EXPECT_TRUE(set("layout", "BasicLayout"));
    log("b", epoch_timeval().sec() + 3);
    EXPECT_TRUE(set("layout.ConversionPattern", "[%m]%n"));
    log("c");
    EXPECT_THAT(content(), testing::MatchesRegex("INFO    : a\n[23] INFO Foo b\n\\[c\\]\n"));
}

TEST_F(LogAppenderTest, PatternLayoutSetsNoLayoutAndUnknownOnesAreRefused) {
    set("fileName", _file);
    set("layout.ConversionPattern", "[%m]%n");
    EXPECT_TRUE(set("layout", "PatternLayout"));
    for (const char* bad : {"", "simpleLayout", "SimpleLayout ", "XMLLayout"}) {
        EXPECT_FALSE(set("layout", bad)) << bad;
    }
    log("x");
    EXPECT_EQ(content(), "[x]\n");
}

TEST_F(LogAppenderTest, TheLastLineThatSetsALayoutWins) {
    set("fileName", _file);
    set("layout.ConversionPattern", "[%m]%n");
    set("layout", "SimpleLayout");
    log("x");
    EXPECT_EQ(content(), "INFO    : x\n");
}

TEST_F(LogAppenderTest, AppendersAreFoundByName) {
    EXPECT_EQ(LogAppender::find("find-1", false), nullptr);
    LogAppender* const made = LogAppender::find("find-1", true);
    ASSERT_NE(made, nullptr);
    EXPECT_EQ(LogAppender::find("find-1", false), made);
    EXPECT_EQ(LogAppender::find("find-1", true), made);
    EXPECT_NE(LogAppender::find("Find-1", true), made);
}

TEST_F(LogAppenderTest, TheRootAppenderHasAFixedName) {
    LogAppender* const root = LogAppender::find("rootAppender", false);
    ASSERT_NE(root, nullptr);
    EXPECT_EQ(LogAppender::find("rootAppender", true), root);
}

TEST_F(LogAppenderTest, FinalSetupCreatesTheFileAndLeavesItClosed) {
    set("fileName", _file);
    const CountCalls opens(Call::open);
    _appender.finalSetup("A1");
    EXPECT_THAT(_dir.names(), ElementsAre("app.log"));
    EXPECT_EQ(opens.count(), 1U);
    log("x");
    EXPECT_EQ(opens.count(), 2U);
}

TEST_F(LogAppenderTest, FinalSetupReportsABadPath) {
    set("fileName", _dir.file("missing/app.log"));
    EXPECT_EQ(
        errOf([&] { _appender.finalSetup("A1"); }),
        "Error opening \"" + _dir.file("missing/app.log") + "\": No such file or directory\n");
}

TEST_F(LogAppenderTest, WithoutAFileItWritesToStandardError) {
    EXPECT_EQ(errOf([&] {
                  _appender.finalSetup("A1");
                  log("x");
              }),
              "Appender \"A1\" has no filename, assuming stderr\nx\n");
}

TEST_F(LogAppenderTest, WithADescriptorItWritesThereWithoutAWarning) {
    EXPECT_EQ(errOf([&] {
                  LogAppender appender{FileDescriptor(2)};
                  appender.finalSetup("A1");
                  appender.write(LogMsgMetadata(&_logger, INFO), "x");
              }),
              "x\n");
}

TEST_F(LogAppenderTest, LimitsWithoutAFileAreReset) {
    EXPECT_EQ(errOf([&] {
                  set("maxBackupIndex", "3");
                  set("maxFileSize", "1");
                  _appender.finalSetup("A1");
                  log("long enough to be rotated");
                  log("and again");
                  _appender.finalSetup("again");
              }),
              "Appender \"A1\" has no filename, assuming stderr\n"
              "Appender \"A1\" has maxBackupIndex set without specifying a filename, ignoring\n"
              "Appender \"A1\" has maxSize set without specifying a filename, ignoring\n"
              "long enough to be rotated\nand again\n");
}

TEST_F(LogAppenderTest, BackupsWithoutALimitAreReset) {
    EXPECT_EQ(errOf([&] {
                  set("fileName", _file);
                  set("maxBackupIndex", "3");
                  _appender.finalSetup("A1");
                  _appender.finalSetup("again");
              }),
              "Appender \"A1\" has maxBackupIndex set without specifying maxSize, ignoring\n");
}

TEST_F(LogAppenderTest, AnAppenderThatIsNotSetUpYetUsesTheRootAppendersLayout) {
    EXPECT_EQ(errOf([&] {
                  LogAppender appender{FileDescriptor(2)};
                  appender.write(LogMsgMetadata(&_logger, INFO), "x");
              }),
              "x\n");
}

TEST_F(LogAppenderTest, AFileThatCannotBeOpenedIsReportedAndTriedAgain) {
    const std::string path = _dir.file("later/app.log");
    EXPECT_EQ(errOf([&] {
                  set("fileName", path);
                  log("lost");
                  ASSERT_EQ(mkdir(_dir.file("later").c_str(), 0755), 0);
                  log("kept");
              }),
              "Error opening \"" + path + "\": No such file or directory\n");
    EXPECT_EQ(readFile(path), "kept\n");
}

TEST_F(LogAppenderTest, AFailingFstatDropsTheMessageAndClosesTheFile) {
    EXPECT_EQ(errOf([&] {
                  set("fileName", _file);
                  const FailNth fault(Call::fstat, 1, EIO);
                  const CountCalls closes(Call::close);
                  log("lost");
                  EXPECT_TRUE(fault.fired());
                  EXPECT_EQ(closes.count(), 1U);
                  log("kept");
              }),
              "Error calling fstat on \"" + _file + "\": Input/output error\n");
    EXPECT_EQ(content(), "kept\n");
}

TEST_F(LogAppenderTest, AnEmptyLineIsNoFailedWrite) {
    EXPECT_EQ(errOf([&] {
                  set("fileName", _file);
                  set("layout.ConversionPattern", "%m");
                  log("");
                  log("text");
              }),
              "");
    EXPECT_EQ(content(), "text");
}

TEST_F(LogAppenderTest, AFailingWriteLosesTheMessageAndOpensAgain) {
    EXPECT_EQ(errOf([&] {
                  set("fileName", _file);
                  log("one");
                  const CountCalls opens(Call::open);
                  {
                      const FailNth fault(Call::write, 1, ENOSPC);
                      log("lost");
                      EXPECT_TRUE(fault.fired());
                  }
                  EXPECT_EQ(opens.count(), 0U);
                  log("two");
                  EXPECT_EQ(opens.count(), 1U);
              }),
              "Error writing to \"" + _file + "\": No space left on device\n");
    EXPECT_EQ(content(), "one\ntwo\n");
}

TEST_F(LogAppenderTest, AnInterruptedWriteGoesOn) {
    EXPECT_EQ(errOf([&] {
                  set("fileName", _file);
                  log("one");
                  const FailNth fault(Call::write, 1, EINTR);
                  log("two");
                  EXPECT_TRUE(fault.fired());
              }),
              "");
    EXPECT_EQ(content(), "one\ntwo\n");
}

TEST_F(LogAppenderTest, AWriteThatGoesOnInPiecesIsWhole) {
    set("fileName", _file);
    log("one");
    const ShortNth fault(Call::write, 1, 2);
    log("second");
    EXPECT_TRUE(fault.fired());
    EXPECT_EQ(content(), "one\nsecond\n");
}

TEST_F(LogAppenderTest, AFailureOfADescriptorIsReportedWithoutANameAndItStaysInUse) {
    EXPECT_EQ(errOf([&] {
                  const int fd = open(_file.c_str(), O_WRONLY | O_CREAT, 0600);
                  LogAppender appender{FileDescriptor(fd)};
                  LogMsgMetadata md(&_logger, INFO);
                  {
                      const FailNth fault(Call::write, 1, EIO);
                      appender.write(md, "lost");
                  }
                  appender.write(md, "kept");
              }),
              "Error writing to \"\": Input/output error\n");
    EXPECT_EQ(content(), "kept\n");
}

TEST_F(LogAppenderTest, TheRootAppendersOwnFailureIsNotReportedIntoItself) {
    EXPECT_EQ(errOf([&] {
                  const FailNth fault(Call::write, 1, EIO);
                  _logger.info("lost");
              }),
              "CRIT - Error writing to \"\": Input/output error\n");
}

TEST_F(LogAppenderTest, TheRootAppenderStaysOnStandardErrorWhateverItIsTold) {
    const std::string err = errOf([&] {
        LogAppender* const root = LogAppender::find("rootAppender", false);
        root->setAttribute("fileName", _file.c_str(), Pathname());
        root->setAttribute("maxFileSize", "1", Pathname());
        root->setAttribute("maxBackupIndex", "1", Pathname());
        const CountCalls closes(Call::close);
        for (const int at : {1000, 1100, 10}) {
            LogMsgMetadata md(&_logger, INFO);
            md.stamp.set(at, 0);
            root->write(md, "x");
        }
        EXPECT_EQ(closes.count(), 0U);
    });
    EXPECT_EQ(err, "x\nx\nx\n");
    EXPECT_THAT(_dir.names(), IsEmpty());
}

TEST_F(LogAppenderTest, AMovedFileIsNoticedAfterMoreThanFiveSeconds) {
    set("fileName", _file);
    log("one", 1000);
    ASSERT_EQ(rename(_file.c_str(), _dir.file("moved").c_str()), 0);
    log("at five", 1005);
    EXPECT_THAT(_dir.names(), ElementsAre("moved"));
    log("at six", 1006);
    EXPECT_EQ(readFile(_dir.file("moved")), "one\nat five\n");
    EXPECT_EQ(content(), "at six\n");
}

TEST_F(LogAppenderTest, ADeletedFileIsMadeAnew) {
    set("fileName", _file);
    log("one", 1000);
    ASSERT_EQ(unlink(_file.c_str()), 0);
    log("two", 1006);
    EXPECT_EQ(content(), "two\n");
}

TEST_F(LogAppenderTest, AReplacedFileIsNoticed) {
    set("fileName", _file);
    log("one", 1000);
    writeFile(_dir.file("other"), "other\n");
    ASSERT_EQ(rename(_dir.file("other").c_str(), _file.c_str()), 0);
    log("two", 1006);
    EXPECT_EQ(content(), "other\ntwo\n");
}

TEST_F(LogAppenderTest, TheSameFileNumberOnAnotherDeviceIsAnotherFile) {
    set("fileName", _file);
    log("one", 1000);
    const ShiftNth elsewhere(Call::stat, 1, 1);
    const CountCalls opens(Call::open);
    log("two", 1006);
    EXPECT_TRUE(elsewhere.fired());
    EXPECT_EQ(opens.count(), 1U);
    EXPECT_EQ(content(), "one\ntwo\n");
}

TEST_F(LogAppenderTest, AClockSetBackForcesACheck) {
    set("fileName", _file);
    log("one", 1000);
    ASSERT_EQ(unlink(_file.c_str()), 0);
    log("two", 999);
    EXPECT_EQ(content(), "two\n");
}

TEST_F(LogAppenderTest, AConfirmedIdentityIsNotCheckedForFiveMoreSeconds) {
    set("fileName", _file);
    log("one", 1000);
    const CountCalls stats(Call::stat);
    log("two", 1005);
    EXPECT_EQ(stats.count(), 0U);
    log("three", 1006);
    EXPECT_EQ(stats.count(), 1U);
    log("in the same second", 1006);
    EXPECT_EQ(stats.count(), 1U);
    log("four", 1011);
    EXPECT_EQ(stats.count(), 1U);
    log("five", 1012);
    EXPECT_EQ(stats.count(), 2U);
    EXPECT_EQ(content(), "one\ntwo\nthree\nin the same second\nfour\nfive\n");
}

TEST_F(LogAppenderTest, TheEndOfTimeDoesNotOverflowTheCheck) {
    set("fileName", _file);
    log("one", 2147483647);
    log("two", 2147483647);
    EXPECT_EQ(content(), "one\ntwo\n");
}

TEST_F(LogAppenderTest, AMutexThatFailsIsDoneWithout) {
    set("fileName", _file);
    const FailNth fault(Call::pthread_mutex_lock, 1, EINVAL, FailNth::FROM_THEN_ON);
    log("x");
    EXPECT_TRUE(fault.fired());
    EXPECT_EQ(content(), "x\n");
}

TEST_F(LogAppenderTest, AThrowingLayoutSendsTheLineToStandardError) {
    EXPECT_EQ(errOf([&] {
                  LogAppender* const a = LogAppender::find("throwing", true);
                  a->setAttribute("fileName", _file.c_str(), Pathname());
                  a->setAttribute("layout.ConversionPattern", "%d{%Z} %m%n", Pathname());
                  LogChannel::find("net", true)->setConfig("throwing");
                  Logger::initialize();
                  Logger logger("net");
                  const FailNth empty(Call::strftime, 1, EINVAL, FailNth::FROM_THEN_ON);
                  logger.warn("kept");
              }),
              "WARN - kept\n");
}

// Two appenders of the channel "Logger" on a full disk.
TEST_F(LogAppenderTest, TwoFailingAppendersDoNotReportIntoEachOtherForEver) {
    if (access("/dev/full", W_OK) != 0) GTEST_SKIP() << "/dev/full is not there";
    const auto link = [&](const char* name) {
        EXPECT_EQ(symlink("/dev/full", _dir.file(name).c_str()), 0);
        LogAppender::find(name, true)
            ->setAttribute("fileName", _dir.file(name).c_str(), Pathname());
    };
    const std::string err = errOf([&] {
        link("full1");
        link("full2");
        LogChannel::find("Logger", true)->setConfig("full1,full2");
        LogChannel::find("net", true)->setConfig("full1,full2");
        Logger::initialize();
        Logger logger("net");
        logger.warn("lost");
    });
    const std::string full = ": No space left on device\n";
    const std::string one = "CRIT - Error writing to \"" + _dir.file("full1") + "\"" + full;
    const std::string two = "CRIT - Error writing to \"" + _dir.file("full2") + "\"" + full;
    // The message to full1 fails; its report fails in full2, which is told first. Then the same the
    // other way round.
    EXPECT_EQ(err, two + one + one + two);
}

// The lines on standard error of one message to that many appenders that all fail, being those of
// the channel "Logger" too.
std::size_t linesOfFailingAppenders(int count, const TempDir& dir) {
    const auto result = runInChild([&] {
        std::string all;
        for (int n = 0; n < count; ++n) {
            const std::string name = "F" + std::to_string(n);
            LogAppender::find(name, true)
                ->setAttribute("fileName", dir.file("missing/" + name).c_str(), Pathname());
            all += name + ",";
        }
        LogChannel::find("Logger", true)->setConfig(all.c_str());
        LogChannel::find("net", true)->setConfig(all.c_str());
        Logger::initialize();
        Logger("net").warn("lost");
        return 0;
    });
    EXPECT_EQ(result.status, 0);
    return static_cast<std::size_t>(std::count(result.err.begin(), result.err.end(), '\n'));
}

TEST_F(LogAppenderTest, TheReportsOfManyFailingAppendersGrowWithTheirSquareAtMost) {
    EXPECT_EQ(linesOfFailingAppenders(1, _dir), 1U);
    EXPECT_EQ(linesOfFailingAppenders(3, _dir), 9U);
    EXPECT_EQ(linesOfFailingAppenders(9, _dir), 81U);
    EXPECT_EQ(linesOfFailingAppenders(20, _dir), 400U);
}

TEST_F(LogAppenderTest, AReportThatOnlyFailingAppendersWereOfferedGoesToStandardError) {
    const std::string err = errOf([&] {
        for (const char* name : {"F", "G"}) {
            LogAppender::find(name, true)
                ->setAttribute("fileName", _dir.file(std::string("missing/") + name).c_str(),
                               Pathname());
        }
        LogChannel::find("Logger", true)->setConfig("G");
        LogChannel::find("net", true)->setConfig("F");
        Logger::initialize();
        Logger("net").warn("lost");
    });
    const auto told = [&](const char* name) {
        return "ERROR - Error opening \"" + _dir.file(std::string("missing/") + name) +
               "\": No such file or directory\n";
    };
    EXPECT_EQ(err, told("G") + told("F"));
}

TEST_F(LogAppenderTest, EachFailureIsToldOnceToAnAppenderThatWorks) {
    EXPECT_EQ(errOf([&] {
                  for (const char* name : {"F", "G"}) {
                      LogAppender::find(name, true)
                          ->setAttribute("fileName",
                                         _dir.file(std::string("missing/") + name).c_str(),
                                         Pathname());
                  }
                  LogAppender::find("W", true)->setAttribute("fileName", _file.c_str(), Pathname());
                  LogChannel::find("Logger", true)->setConfig("G,F,W");
                  LogChannel::find("net", true)->setConfig("F");
                  Logger::initialize();
                  Logger("net").warn("lost");
              }),
              "");
    const auto told = [&](const char* name) {
        return "Error opening \"" + _dir.file(std::string("missing/") + name) +
               "\": No such file or directory\n";
    };
    EXPECT_EQ(content(), told("G") + told("F"));
}

TEST_F(LogAppenderTest, AnAppenderThatRecoversIsTriedAgainByTheNextMessage) {
    EXPECT_EQ(errOf([&] {
                  LogAppender* const bad = LogAppender::find("bad", true);
                  bad->setAttribute("fileName", _file.c_str(), Pathname());
                  LogChannel::find("Logger", true)->setConfig("bad");
                  Logger::initialize();
                  {
                      const FailNth fault(Call::open, 1, EACCES);
                      Logger("Logger").warn("lost");
                      EXPECT_TRUE(fault.fired());
                  }
                  LogFormat::internal(nullptr, WARN, "kept");
              }),
              "ERROR - Error opening \"" + _file + "\": Permission denied\n");
    EXPECT_EQ(content(), "kept\n");
}

TEST_F(LogAppenderTest, ALineThatWasCutCountsAndRotatesAFullFile) {
    set("fileName", _file);
    set("maxFileSize", "10");
    set("maxBackupIndex", "1");
    EXPECT_EQ(errOf([&] {
                  log("12345678");  // 9 bytes with the newline
                  const ShortNth cut(Call::write, 1, 2, EFBIG);
                  log("abcdef");
              }),
              "Error writing to \"" + _file + "\": File too large\n");
    EXPECT_EQ(readFile(_file + ".1"), "12345678\nab");
    EXPECT_EQ(content(), "");
}

TEST_F(LogAppenderTest, ALineThatWasCutAtTheLimitDoesNotRotate) {
    set("fileName", _file);
    set("maxFileSize", "11");
    set("maxBackupIndex", "1");
    errOf([&] {
        log("12345678");
        const ShortNth cut(Call::write, 1, 2, EFBIG);
        log("abcdef");
    });
    EXPECT_EQ(content(), "12345678\nab");
    EXPECT_EQ(_dir.names().size(), 1U);
}

TEST_F(LogAppenderTest, AFailedRotationBehindALineThatWasCutIsToldToo) {
    set("fileName", _file);
    set("maxFileSize", "1");
    EXPECT_EQ(errOf([&] {
                  const ShortNth cut(Call::write, 1, 2, EFBIG);
                  const FailNth closed(Call::open, 2, EMFILE);
                  log("abcdef");
              }),
              "Error writing to \"" + _file + "\": File too large\nError opening \"" + _file +
                  "\": Too many open files\n");
}

TEST_F(LogAppenderTest, ADescriptorThatWasHandedInIsNeverClosed) {
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    {
        LogAppender appender{FileDescriptor(ends[1])};
        appender.setAttribute("fileName", _file.c_str(), Pathname());
        appender.write(LogMsgMetadata(&_logger, INFO), "x");
    }
    EXPECT_EQ(content(), "x\n");
    EXPECT_NE(fcntl(ends[1], F_GETFD), -1);
    close(ends[0]);
    close(ends[1]);
}

TEST_F(LogAppenderTest, WithoutALayoutTheRootAppendersAtTheTimeOfTheLineIsUsed) {
    EXPECT_EQ(errOf([&] {
                  LogAppender appender{FileDescriptor(STDERR_FILENO)};
                  appender.write(LogMsgMetadata(&_logger, INFO), "x");
                  LogAppender::find("rootAppender", false)
                      ->setAttribute("layout", "SimpleLayout", Pathname());
                  appender.write(LogMsgMetadata(&_logger, INFO), "x");
              }),
              "x\nINFO    : x\n");
}

// The warning of the one is the first line of the other.
TEST_F(LogAppenderTest, ATestOpenLeavesNoOtherDescriptorBehind) {
    EXPECT_EQ(errOf([&] {
                  LogAppender* const a = LogAppender::find("A", true);
                  LogAppender* const b = LogAppender::find("B", true);
                  a->setAttribute("maxBackupIndex", "1", Pathname());
                  a->setAttribute("fileName", _dir.file("a").c_str(), Pathname());
                  b->setAttribute("fileName", _file.c_str(), Pathname());
                  LogChannel::find("Logger", true)->setConfig("B");
                  Logger::initialize();
                  const CountCalls opens(Call::open);
                  const CountCalls closes(Call::close);
                  a->finalSetup("A");
                  b->finalSetup("B");
                  EXPECT_EQ(opens.count(), 3U);
                  EXPECT_EQ(closes.count(), 3U);
              }),
              "");
    EXPECT_THAT(content(), testing::HasSubstr("maxBackupIndex set without specifying maxSize"));
}

TEST_F(LogAppenderTest, AReportGoesToTheOtherAppendersOfTheChannelLogger) {
    EXPECT_EQ(errOf([&] {
                  LogAppender* const bad = LogAppender::find("bad", true);
                  bad->setAttribute("fileName", _dir.file("missing/x").c_str(), Pathname());
                  LogAppender* const good = LogAppender::find("good", true);
                  good->setAttribute("fileName", _file.c_str(), Pathname());
                  LogChannel::find("Logger", true)->setConfig("bad,good");
                  LogChannel::find("net", true)->setConfig("bad,good");
                  Logger::initialize();
                  Logger logger("net");
                  logger.warn("message");
              }),
              "");
    EXPECT_EQ(content(), "Error opening \"" + _dir.file("missing/x") +
                             "\": No such file or directory\nmessage\n")
        << "the report comes before the next appender's turn";
}

TEST_F(LogAppenderTest, ManyThreadsWriteWholeLines) {
    set("fileName", _file);
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&, t] {
            for (int i = 0; i < 500; ++i)
                log(std::string(50, static_cast<char>('a' + t)));
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    std::size_t lines = 0;
    std::istringstream in(content());
    for (std::string line; std::getline(in, line); ++lines) {
        ASSERT_EQ(line, std::string(50, line.empty() ? '?' : line[0]));
    }
    EXPECT_EQ(lines, 2000U);
}

}  // namespace
