#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/Faults.h"
#include "support/TempDir.h"

// There is one store a process, so each test has its own in a child; its messages are on the
// child's standard error, as bare texts.

namespace {

using namespace storesteps;
using testing::ElementsAre;
using testsupport::Call;
using testsupport::ChildResult;
using testsupport::CountCalls;
using testsupport::FailNth;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::ShortNth;
using testsupport::TempDir;
using testsupport::writeFile;

const char kNoVersion[] =
    "No version string found in hash db.  File has been modified or was never migrated.";
const std::string kShort = "Short read, record file may be corrupt.\n";
const std::string kShortKeyLength = "Short read for key length, record file may be corrupt.\n";
const std::string kShortValueLength = "Short read for value length, record file may be corrupt.\n";

std::string joined(const std::vector<std::string>& texts) {
    std::string line;
    for (const std::string& text : texts)
        line += text + ";";
    return line;
}

// A ComponentException's message; "" when nothing was thrown.
std::string thrownBy(const std::function<void()>& body) {
    try {
        body();
    } catch (const ComponentException& e) {
        return e.what();
    }
    return "";
}

class RecordFileManagerTest : public testing::Test {
  protected:
    RecordFileManagerTest() : _file(_dir.file("data")) {}

    // Runs body in a process with a store of its own; what it writes to standard error. What it
    // prints is in _out.
    std::string run(const std::function<void()>& body) {
        const ChildResult result = runInChild([&] {
            store().setDBFile(Pathname(_file));
            body();
            return 0;
        });
        EXPECT_EQ(result.status, 0) << "signal " << result.signal << ": " << result.err;
        _out = result.out;
        return result.err;
    }
    // What a fresh process logs when it loads the file; the records (and what was thrown) in _out.
    std::string load(const std::string& content) {
        writeFile(_file, content);
        return run([] {
            const std::string thrown = thrownBy([] { store().readFile(); });
            fputs(joined(all()).c_str(), stdout);
            fputs(thrown.c_str(), stdout);
        });
    }

    TempDir _dir;
    const std::string _file;
    std::string _out;
};

TEST_F(RecordFileManagerTest, AnEmptyStoreIsTheVersionRecordAlone) {
    EXPECT_EQ(run([] { store().saveToFile(); }), "");
    EXPECT_EQ(readFile(_file), kVersionRecord);
}

TEST_F(RecordFileManagerTest, RecordsAreSavedInByteWiseKeyOrder) {
    run([] {
        put("b", "2");
        put("a", "1");
        put("\xff", "4");
        put("ab", "");
        put("B", std::string("\0\n", 2));
        put("", "empty key", true);
    });
    EXPECT_EQ(readFile(_file), kVersionRecord + record("", "empty key") +
                                   record("B", std::string("\0\n", 2)) + record("a", "1") +
                                   record("ab", "") + record("b", "2") + record("\xff", "4"));
}

TEST_F(RecordFileManagerTest, WhatWasSavedIsReadBack) {
    std::string big;
    for (int i = 0; i < 2500; ++i)
        big += static_cast<char>(i);
    run([&] {
        put("big", big);
        put("empty", "");
        put("", "no key", true);
    });
    EXPECT_EQ(run([&] {
                  store().readFile();
                  if (get("big") == big && get("empty").empty() && get("") == "no key")
                      fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, SavingLogsAtDebugLevel) {
    EXPECT_EQ(run([] {
                  Logger::setChannelLevel("recordFileManager", "DEBUG");
                  Logger::initialize();
                  put("a", "1");
                  put("a", "2", true);
                  store().remove("a");
              }),
              "Writing record file to disk.\nWriting record file to disk.\n");
}

TEST_F(RecordFileManagerTest, OnlyASaveReachesTheFile) {
    run([this] {
        put("a", "1", true);
        const std::string before = readFile(_file);
        put("a", "2");
        put("b", "3");
        if (readFile(_file) == before && get("a") == "2") fputs("ok", stdout);
    });
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, TheExactVersionKeyIsRefused) {
    EXPECT_EQ(run([this] {
                  put("_record-file-version", "x", true);
                  if (all().empty() && readFile(_file).empty()) fputs("ok", stdout);
              }),
              "Someone attempted to add internal version key to map - refusing.\n");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, AnotherSpellingIsStoredButComesBackAsTheVersion) {
    run([] {
        put("_Record-File-Version", "x");
        put("_record-file-versionX", "y");
        put("_record-file-versio", "z", true);
        fputs(joined(all()).c_str(), stdout);
    });
    EXPECT_EQ(_out, "_Record-File-Version=x;_record-file-versio=z;_record-file-versionX=y;");
    EXPECT_EQ(run([] {
                  store().readFile();
                  fputs(joined(all()).c_str(), stdout);
              }),
              "");
    EXPECT_EQ(_out, "_record-file-versio=z;");
}

TEST_F(RecordFileManagerTest, GetHandsOutCopies) {
    EXPECT_EQ(run([] {
                  put("a", "abc");
                  PersistentHashData data;
                  store().get("a", data);
                  static_cast<char*>(data._pData)[0] = 'X';
                  delete[] static_cast<char*>(data._pData);
                  PersistentHashData absent;
                  absent._pData = &absent;
                  absent._size = 77;
                  store().get("b", absent);
                  if (get("a") == "abc" && absent._pData == nullptr && absent._size == 77)
                      fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, AValueOfSizeZeroIsNotNull) {
    run([] {
        PersistentHashData none;
        store().put("a", none, false);
        PersistentHashData data;
        store().get("a", data);
        if (data._pData != nullptr && data._size == 0) fputs("ok", stdout);
        delete[] static_cast<char*>(data._pData);
    });
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, AValueMayBePutFromTheStoresOwnCopy) {
    run([] {
        put("a", "abc");
        PersistentHashData data;
        store().get("a", data);
        store().put("a", data, false);
        fputs(get("a").c_str(), stdout);
        delete[] static_cast<char*>(data._pData);
    });
    EXPECT_EQ(_out, "abc");
}

TEST_F(RecordFileManagerTest, RemoveSavesOnlyWhenTheKeyWasThere) {
    run([this] {
        put("a", "1");
        put("b", "2");
        const bool absent = store().remove("c");
        const bool untouched = readFile(_file).empty();
        const bool removed = store().remove("a");
        if (!absent && untouched && removed && get("a") == "(absent)") fputs("ok", stdout);
    });
    EXPECT_EQ(_out, "ok");
    EXPECT_EQ(readFile(_file), kVersionRecord + record("b", "2"));
}

TEST_F(RecordFileManagerTest, SeveralMayBeRemovedWithOneSave) {
    EXPECT_EQ(run([this] {
                  for (const char* key : {"a", "b", "c", "d"})
                      put(key, "1");
                  store().saveToFile();
                  const std::string before = readFile(_file);
                  const bool absent = store().remove("x", false);
                  const bool first = store().remove("a", false);
                  const bool again = store().remove("a", false);
                  const bool untouched = readFile(_file) == before && get("a") == "(absent)";
                  const bool absentAndNotSaved =
                      !store().remove("y", true) && readFile(_file) == before;
                  const bool last = store().remove("b", true);
                  if (!absent && first && !again && untouched && absentAndNotSaved && last)
                      fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
    EXPECT_EQ(readFile(_file), kVersionRecord + record("c", "1") + record("d", "1"));
}

TEST_F(RecordFileManagerTest, RemovingWithoutASaveNeedsNoFileName) {
    const ChildResult result = runInChild([] {
        put("a", "1");
        put("b", "2");
        if (store().remove("a", false)) fputs(joined(all()).c_str(), stdout);
        fputs(thrownBy([] { store().remove("b", true); }).c_str(), stdout);
        fputs(joined(all()).c_str(), stdout);
        return 0;
    });
    EXPECT_EQ(result.out, "b=2;Tried to write to db without setting filename.")
        << "the record is gone whatever the save does";
    EXPECT_EQ(result.err, "Tried to write to db without setting filename.\n");
}

TEST_F(RecordFileManagerTest, EnumerateMatchesThePrefixAndAppends) {
    run([] {
        for (const char* key : {"abc", "ab", "a", "AB", "b", "abd\xff"})
            put(key, "1");
        fputs((joined(all("ab")) + " " + joined(all()) + " " + joined(all("ac"))).c_str(), stdout);
        std::vector<PersistentFullData> list(1);
        store().enumerate("b", list);
        if (list.size() == 2 && list[0]._pData == nullptr) fputs(" appended", stdout);
        delete[] static_cast<char*>(list[1]._pData);
        delete[] static_cast<char*>(list[1]._pKey);
    });
    EXPECT_EQ(_out, "ab=1;abc=1;abd\xff=1; AB=1;a=1;ab=1;abc=1;abd\xff=1;b=1;  appended");
}

TEST_F(RecordFileManagerTest, InitFindsTheFileBelowTheDatabaseDirectory) {
    ASSERT_EQ(mkdir(_dir.file("hashDb").c_str(), 0700), 0);
    writeFile(_dir.file("hashDb/data"), kVersionRecord + record("a", "1"));
    const ChildResult result = runInChild([&] {
        setenv("KORVEX_DB", _dir.path().c_str(), 1);
        LoaderInfo::getInstance()->populateFromEnvironment();
        store().init(xml::node());
        put("b", "2", true);
        return get("a") == "1" ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(readFile(_dir.file("hashDb/data")),
              kVersionRecord + record("a", "1") + record("b", "2"));
}

TEST_F(RecordFileManagerTest, AMissingFileIsSilentlyEmptyAndKeepsWhatIsThere) {
    EXPECT_EQ(run([] {
                  put("a", "1");
                  store().readFile();
                  fputs(joined(all()).c_str(), stdout);
              }),
              "");
    EXPECT_EQ(_out, "a=1;");
}

TEST_F(RecordFileManagerTest, AnEmptyFileLoadsQuietly) {
    EXPECT_EQ(load(""), "");
    EXPECT_EQ(_out, "");
}

TEST_F(RecordFileManagerTest, AWholeFileWithoutAVersionLoadsQuietly) {
    EXPECT_EQ(load(record("a", "1") + record("b", "2")), "");
    EXPECT_EQ(_out, "a=1;b=2;");
}

TEST_F(RecordFileManagerTest, VersionRecordsAreToldByTheirBeginningInAnyCase) {
    EXPECT_EQ(load(record("_RECORD-FILE-VERSION", "1") + record("_record-file-versionX", "2") +
                   record("_record-file-versio", "3")),
              "");
    EXPECT_EQ(_out, "_record-file-versio=3;");
}

TEST_F(RecordFileManagerTest, AnyVersionIsAccepted) {
    EXPECT_EQ(load(record("_record-file-version", "99") + record("a", "abc").substr(0, 11)),
              kShort);
    EXPECT_EQ(_out, std::string("a=ab").c_str()) << "printed up to the NUL";
}

TEST_F(RecordFileManagerTest, AnEmptyVersionIsNone) {
    EXPECT_EQ(load(record("_record-file-version", "") + record("a", "abc").substr(0, 11)),
              kShort + kNoVersion + "\n");
    EXPECT_EQ(load(record("_record-file-version", std::string("\0x", 2)) +
                   record("a", "abc").substr(0, 11)),
              kShort + kNoVersion + "\n")
        << "it ends at its first NUL";
}

TEST_F(RecordFileManagerTest, AKeyEndsAtItsFirstNul) {
    EXPECT_EQ(load(kVersionRecord + record(std::string("a\0b", 3), "1")), "");
    EXPECT_EQ(_out, "a=1;");
}

TEST_F(RecordFileManagerTest, OfTwoRecordsWithOneKeyTheLaterOneStays) {
    EXPECT_EQ(load(record("b", "1") + record("a", "2") + record("b", "3")), "");
    EXPECT_EQ(_out, "a=2;b=3;");
}

TEST_F(RecordFileManagerTest, ACutKeyLengthIsReportedAndWhatWasReadStays) {
    for (std::size_t n = 1; n < 4; ++n) {
        EXPECT_EQ(load(record("a", "1") + u32(5).substr(0, n)), kShortKeyLength) << n;
        EXPECT_EQ(_out, "a=1;");
    }
}

TEST_F(RecordFileManagerTest, ACutKeyIsReportedTwice) {
    EXPECT_EQ(load(record("a", "1") + u32(5) + "abc"), kShort + kShortValueLength);
    EXPECT_EQ(_out, "a=1;");
    EXPECT_EQ(load(record("a", "1") + u32(5)), kShort + kShortValueLength);
}

TEST_F(RecordFileManagerTest, ACutValueLengthIsReported) {
    for (std::size_t n = 0; n < 4; ++n) {
        EXPECT_EQ(load(record("a", "1") + field("key") + u32(5).substr(0, n)), kShortValueLength)
            << n;
        EXPECT_EQ(_out, "a=1;");
    }
}

TEST_F(RecordFileManagerTest, ACutValueIsStoredWithZeroBytesAndItsFullLength) {
    writeFile(_file, kVersionRecord + u32(1) + "a" + u32(6) + "xyz");
    EXPECT_EQ(run([] {
                  store().readFile();
                  if (get("a") == std::string("xyz\0\0\0", 6)) fputs("ok", stdout);
              }),
              kShort);
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, ACutValueInAFileWithoutAVersionThrowsAfterStoring) {
    EXPECT_EQ(load(u32(1) + "a" + u32(3)), kShort + kNoVersion + "\n");
    EXPECT_EQ(_out, std::string("a=") + kNoVersion) << "the zero bytes end the printed text";
}

TEST_F(RecordFileManagerTest, AShortChunkIsReportedEachTime) {
    const auto cut = [](std::size_t claimed, std::size_t there) {
        return kVersionRecord + u32(1) + "a" + u32(claimed) + std::string(there, 'x');
    };
    EXPECT_EQ(load(cut(2500, 2400)), kShort) << "in the last chunk";
    EXPECT_EQ(load(cut(2500, 2000)), kShort) << "nothing in the last chunk";
    EXPECT_EQ(load(cut(2500, 1500)), kShort + kShort) << "in a middle chunk, then nothing";
    EXPECT_EQ(load(cut(3500, 1000)), kShort) << "where nothing comes, nothing more is tried";
    EXPECT_EQ(load(cut(3500, 1500)), kShort + kShort);
    EXPECT_EQ(load(cut(1000, 999)), kShort);
    EXPECT_EQ(load(cut(1000, 1000)), "");
    EXPECT_EQ(load(cut(1001, 1000)), kShort);
}

TEST_F(RecordFileManagerTest, AFileIsReadAtOnce) {
    writeFile(_file, kVersionRecord + record("a", std::string(250000, 'x')) + record("b", "2"));
    run([] {
        const CountCalls reads(Call::fread);
        store().readFile();
        if (reads.count() == 1 && all().size() == 2) fputs("ok", stdout);
    });
    EXPECT_EQ(_out, "ok");
}

// Its size is not known before, and it cannot be read twice.
TEST_F(RecordFileManagerTest, APipeIsReadLikeAFile) {
    for (const std::size_t size : {0U, 1000U, 4095U, 4096U, 4097U, 100000U}) {
        const std::string content = kVersionRecord + record("a", std::string(size, 'x'));
        ASSERT_EQ(mkfifo(_file.c_str(), 0600), 0);
        std::thread writer([&] { writeFile(_file, content); });
        EXPECT_EQ(run([&] {
                      store().readFile();
                      if (get("a") == std::string(size, 'x')) fputs("ok", stdout);
                  }),
                  "");
        writer.join();
        EXPECT_EQ(_out, "ok") << size;
        ASSERT_EQ(unlink(_file.c_str()), 0);
    }
}

TEST_F(RecordFileManagerTest, AFileWhoseSizeIsNotToldIsReadAllTheSame) {
    const std::string value(10000, 'x');
    writeFile(_file, kVersionRecord + record("a", value));
    EXPECT_EQ(run([&] {
                  const FailNth fault(Call::fstat, 1, EIO);
                  store().readFile();
                  if (fault.fired() && get("a") == value) fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, APipeThatEndsInAValueIsTold) {
    ASSERT_EQ(mkfifo(_file.c_str(), 0600), 0);
    std::thread writer(
        [&] { writeFile(_file, u32(1) + "a" + u32(9000) + std::string(8500, 'x')); });
    EXPECT_EQ(run([&] {
                  fputs(thrownBy([] { store().readFile(); }).c_str(), stdout);
                  if (get("a") == std::string(8500, 'x') + std::string(500, '\0'))
                      fputs("ok", stdout);
              }),
              kShort + kNoVersion + "\n");
    writer.join();
    EXPECT_EQ(_out, kNoVersion + std::string("ok"));
}

TEST_F(RecordFileManagerTest, AnOpenDescriptorIsAPathToo) {
    writeFile(_file, kVersionRecord + record("a", "1"));
    run([this] {
        std::FILE* const file = fopen(_file.c_str(), "r");
        store().setDBFile(Pathname("/dev/fd/" + std::to_string(fileno(file))));
        store().readFile();
        fputs(joined(all()).c_str(), stdout);
        fclose(file);
    });
    EXPECT_EQ(_out, "a=1;");
}

TEST_F(RecordFileManagerTest, AReadErrorIsToldLikeAMissingEnd) {
    writeFile(_file, kVersionRecord + record("a", "1"));
    EXPECT_EQ(run([] {
                  const FailNth fault(Call::fread, 1, EIO);
                  store().readFile();
                  fputs(joined(all()).c_str(), stdout);
              }),
              kShortKeyLength);
    EXPECT_EQ(_out, "");
}

TEST_F(RecordFileManagerTest, AReadErrorInAValueIsToldTwiceAndThrowsNothing) {
    writeFile(_file, u32(1) + "a" + u32(6) + "xyz");
    EXPECT_EQ(run([] {
                  const ShortNth fault(Call::fread, 1, 12);  // it does not say that this is the end
                  store().readFile();
                  if (get("a") == std::string("xyz\0\0\0", 6)) fputs("ok", stdout);
              }),
              kShort + kShortKeyLength);
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, ALoadedFileIsWrittenAsItLies) {
    std::string first = kVersionRecord;
    for (int i = 1000; i < 2000; ++i)
        first += record("key" + std::to_string(i), std::string(100, 'x'));
    writeFile(_file, first);
    run([] {
        store().readFile();
        const CountCalls writes(Call::fwrite);
        store().saveToFile();
        if (writes.count() == 2) fputs("ok", stdout);  // the version, and all the others
    });
    EXPECT_EQ(_out, "ok");
    EXPECT_TRUE(readFile(_file) == first);
}

TEST_F(RecordFileManagerTest, LoadedAndPutRecordsAreSavedTogether) {
    writeFile(_file, kVersionRecord + record("a", "1") + record("b", "2") +
                         record(std::string("c\0c", 3), "3") + record("d", "4") + record("e", "5") +
                         record("f", "6"));
    run([] {
        store().readFile();
        put("b", "changed");
        put("bb", "new");
        store().remove("e", false);
        put("f", "changed");
        put("f", "6");
        store().remove("bb", false);
        put("bb", "again", true);
    });
    EXPECT_EQ(readFile(_file), kVersionRecord + record("a", "1") + record("b", "changed") +
                                   record("bb", "again") + record("c", "3") + record("d", "4") +
                                   record("f", "6"));
}

// What the address sanitizer has to say of it is the test.
TEST_F(RecordFileManagerTest, ALoadedFilesBytesLiveAsLongAsItsRecords) {
    writeFile(_file, kVersionRecord + record("a", "1") + record("b", "2") + record("b", "3"));
    writeFile(_dir.file("other"), record("c", "4"));
    run([this] {
        store().readFile();
        store().preload("", Pathname(_dir.file("other")));
        store().remove("a", false);
        store().remove("c", false);
        fputs(joined(all()).c_str(), stdout);
        store().preload("", Pathname(_dir.file("other")));
        store().remove("b", false);
        put("c", "5");
        put("c", "6");
        fputs(joined(all()).c_str(), stdout);
        store().remove("c", false);
        fputs(joined(all()).c_str(), stdout);
    });
    EXPECT_EQ(_out, "b=3;c=6;");
}

TEST_F(RecordFileManagerTest, AFileMayBeLoadedAgainOverWhatIsThere) {
    const std::string second = kVersionRecord + record("b", "B") + record("c", "C");
    writeFile(_file, kVersionRecord + record("a", "1") + record("b", "2"));
    writeFile(_dir.file("other"), second);
    run([&] {
        store().readFile();
        store().preload("", Pathname(_dir.file("other")));
        put("c", "3");
        store().readFile();
        store().remove("a");
        fputs(joined(all()).c_str(), stdout);
    });
    EXPECT_EQ(_out, "b=2;c=3;");
    EXPECT_EQ(readFile(_file), kVersionRecord + record("b", "2") + record("c", "3"));
    EXPECT_EQ(readFile(_dir.file("other")), second);
}

TEST_F(RecordFileManagerTest, AClaimOfFourGibibytesTouchesNoGibibytes) {
#ifdef __SANITIZE_THREAD__
    GTEST_SKIP() << "the thread sanitizer's calloc touches all it gives away";
#endif
    const std::string claims[] = {kVersionRecord + u32(1) + "a" + "\xff\xff\xff\xff" + "xyz",
                                  kVersionRecord + "\xff\xff\xff\xff" + "xyz"};
    for (const std::string& claim : claims) {
        writeFile(_file, claim);
        run([] {
            thrownBy([] { store().readFile(); });
            struct rusage usage {};
            getrusage(RUSAGE_SELF, &usage);
            if (usage.ru_maxrss < 1000000) fputs("ok", stdout);
        });
        EXPECT_EQ(_out, "ok");
    }
}

TEST_F(RecordFileManagerTest, AnUnreadableFileIsReported) {
    ASSERT_EQ(mkdir(_file.c_str(), 0700), 0);
    EXPECT_EQ(run([] { store().readFile(); }), kShortKeyLength);
}

// Only what cannot stay where it lies in the file's bytes takes memory of its own.
TEST_F(RecordFileManagerTest, AllocationFailuresThrowAndCloseTheFile) {
    const std::string forFile = "Unable to allocate memory for reading hash key.";
    const std::string forCut = "Unable to allocate memory for reading hash value.";
    const std::string forCopy = "Unable to allocate memory for storing hash value.";
    const std::string whole = kVersionRecord + record("a", "1");
    const std::string cut = u32(1) + "b" + u32(9) + "2";
    const struct {
        std::string content;
        unsigned long failing;
        std::string message;
        std::string left;
    } cases[] = {
        {whole, 1, forFile, ""},
        {whole + record(std::string("b\0b", 3), "2"), 2, forCopy, "a=1;"},
        {whole + cut, 2, forCut, "a=1;"},
    };
    for (const auto& [content, failing, message, left] : cases) {
        writeFile(_file, content);
        EXPECT_EQ(run([&, k = failing] {
                      const CountCalls closes(Call::fclose);
                      {
                          const FailNth fault(Call::calloc, k, ENOMEM);
                          fputs(thrownBy([] { store().readFile(); }).c_str(), stdout);
                          if (!fault.fired() || closes.count() != 1) fputs("not so", stdout);
                      }
                      put("z", "9");  // the lock is free again
                      fputs(joined(all()).c_str(), stdout);
                  }),
                  message + "\n");
        EXPECT_EQ(_out, message + left + "z=9;");
    }
}

TEST_F(RecordFileManagerTest, AMissingVersionLeavesTheLockFree) {
    writeFile(_file, u32(1) + "a" + u32(1));
    run([] {
        thrownBy([] { store().readFile(); });
        put("b", "2");
        if (get("b") == "2") fputs("ok", stdout);
    });
    EXPECT_EQ(_out, "ok");
}

// A key or a version that claims more than the file has takes no memory at all.
TEST_F(RecordFileManagerTest, AClaimOfAKeyTakesNoMemory) {
    const std::string claims[] = {
        kVersionRecord + "\xff\xff\xff\xff" + "xyz",
        record("a", "1") + field("_record-file-version") + "\xff\xff\xff\xff" + "xyz"};
    for (const std::string& claim : claims) {
        writeFile(_file, claim);
        run([] {
            const CountCalls allocations(Call::calloc);
            store().readFile();
            if (allocations.count() == 1) fputs("ok", stdout);
        });
        EXPECT_EQ(_out, "ok");
    }
}

TEST_F(RecordFileManagerTest, PutWithoutMemoryThrowsAndChangesNothing) {
    const std::string message = "Unable to allocate memory for storing hash value.";
    EXPECT_EQ(run([] {
                  put("a", "1");
                  {
                      const FailNth fault(Call::calloc, 1, ENOMEM);
                      fputs(thrownBy([] { put("a", "2"); }).c_str(), stdout);
                  }
                  put("b", "3");  // the lock is free again
                  fputs(joined(all()).c_str(), stdout);
              }),
              message + "\n");
    EXPECT_EQ(_out, message + "a=1;b=3;");
}

TEST_F(RecordFileManagerTest, SavingWithoutAFileNameThrows) {
    const std::string message = "Tried to write to db without setting filename.";
    const ChildResult result = runInChild([] {
        fputs(thrownBy([] { put("a", "1", true); }).c_str(), stdout);
        put("b", "2");  // the lock is free again
        fputs(joined(all()).c_str(), stdout);
        return 0;
    });
    EXPECT_EQ(result.out, message + "a=1;b=2;");
    EXPECT_EQ(result.err, message + "\n");
}

TEST_F(RecordFileManagerTest, ASaveThatCannotOpenIsReported) {
    ASSERT_EQ(mkdir(_file.c_str(), 0700), 0);
    EXPECT_EQ(run([] {
                  put("a", "1", true);
                  fputs(joined(all()).c_str(), stdout);
              }),
              "Unable to open record file for writing at '" + _file +
                  "'.  Cannot save hash data.  Error is 21: Is a directory.\n");
    EXPECT_EQ(_out, "a=1;");
}

// Of three values the first two are staged, the third is handed on as it lies.
const std::size_t kStaged[] = {40000, 40000, 70000};

std::string largeRecords() {
    std::string content = kVersionRecord;
    for (std::size_t i = 0; i < 3; ++i)
        content += record("key" + std::to_string(i), std::string(kStaged[i], "abc"[i]));
    return content;
}

void putLargeRecords() {
    for (std::size_t i = 0; i < 3; ++i)
        put("key" + std::to_string(i), std::string(kStaged[i], "abc"[i]));
}

TEST_F(RecordFileManagerTest, AFailingWriteGivesUpAndKeepsMemory) {
    const std::string message =
        "Failed to write record, giving up on saving file.  Error is 28: No space left on "
        "device.\n";
    // The staging is handed on where a record does not fit.
    const std::size_t head = 4 + 4 + 4;
    const std::size_t first = kVersionRecord.size() + head + kStaged[0];
    const std::size_t left[] = {0, first, first + head + kStaged[1]};
    for (unsigned long k = 1; k <= 3; ++k) {
        EXPECT_EQ(run([&] {
                      putLargeRecords();
                      const CountCalls closes(Call::fclose);
                      const FailNth fault(Call::fwrite, k, ENOSPC);
                      store().saveToFile();
                      if (!fault.fired() || fault.count() != k || closes.count() != 1)
                          fputs("not so", stdout);
                      if (all().size() != 3 || get("key2") != std::string(kStaged[2], 'c'))
                          fputs("memory", stdout);
                  }),
                  message);
        EXPECT_EQ(_out, "") << k;
        const std::string file = readFile(_file);
        EXPECT_EQ(file.size(), left[k - 1]);
        EXPECT_TRUE(file == largeRecords().substr(0, file.size())) << k;
    }
    EXPECT_EQ(run([] {
                  putLargeRecords();
                  const CountCalls writes(Call::fwrite);
                  store().saveToFile();
                  if (writes.count() == 3) fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
    EXPECT_TRUE(readFile(_file) == largeRecords());
}

TEST_F(RecordFileManagerTest, AShortWriteIsAFailedOne) {
    for (unsigned long k = 1; k <= 3; ++k) {
        EXPECT_THAT(run([&] {
                        putLargeRecords();
                        const ShortNth fault(Call::fwrite, k, 100);
                        store().saveToFile();
                        if (!fault.fired() || fault.count() != k) fputs("not so", stdout);
                    }),
                    testing::StartsWith("Failed to write record, giving up on saving file."));
        EXPECT_EQ(_out, "") << k;
        const std::string left = readFile(_file);
        EXPECT_TRUE(left == largeRecords().substr(0, left.size())) << k;
        EXPECT_LT(left.size(), largeRecords().size());
    }
}

TEST_F(RecordFileManagerTest, ASaveAfterAFailedOneIsWhole) {
    run([] {
        putLargeRecords();
        {
            const FailNth fault(Call::fwrite, 2, ENOSPC);
            store().saveToFile();
        }
        store().saveToFile();
    });
    EXPECT_TRUE(readFile(_file) == largeRecords());
}

TEST_F(RecordFileManagerTest, EveryVerbReportsAFailedWriteAndAFailedClose) {
    const std::function<void()> verbs[] = {
        [] { store().saveToFile(); },
        [] { put("a", "1", true); },
        [] { store().remove("key0"); },
    };
    for (const std::function<void()>& verb : verbs) {
        for (const Call call : {Call::fwrite, Call::fclose}) {
            EXPECT_EQ(run([&] {
                          put("key0", "");
                          const FailNth fault(call, 1, EIO);
                          verb();
                      }),
                      "Failed to write record, giving up on saving file.  Error is 5: "
                      "Input/output error.\n");
        }
    }
}

TEST_F(RecordFileManagerTest, ASaveWithoutMemoryForItsStagingIsWhole) {
    EXPECT_EQ(run([] {
                  put("", "");
                  put("a", "1");
                  const FailNth fault(Call::new_array, 1, ENOMEM);
                  store().saveToFile();
                  if (fault.fired()) fputs("ok", stdout);
              }),
              "");
    EXPECT_EQ(_out, "ok");
    EXPECT_EQ(readFile(_file), kVersionRecord + record("", "") + record("a", "1"));
}

TEST_F(RecordFileManagerTest, KeysOfAllLengthsLieBetweenTheirLengths) {
    std::string expected = kVersionRecord;
    std::vector<std::string> keys;
    for (const std::size_t length : {0U, 1U, 246U, 247U, 248U, 249U, 255U, 256U, 257U, 5000U}) {
        keys.emplace_back(length, 'k');
        expected += record(keys.back(), "value");
    }
    EXPECT_EQ(run([&] {
                  for (const std::string& key : keys)
                      put(key, "value");
                  store().saveToFile();
              }),
              "");
    EXPECT_EQ(readFile(_file), expected);
}

TEST_F(RecordFileManagerTest, AFullDiskIsReported) {
    if (access("/dev/full", W_OK) != 0) GTEST_SKIP() << "/dev/full is not there";
    EXPECT_EQ(run([] {
                  store().setDBFile(Pathname("/dev/full"));
                  put("a", "1", true);
                  store().remove("a");  // nothing is left but the version
              }),
              "Failed to write record, giving up on saving file.  Error is 28: No space left on "
              "device.\n"
              "Failed to write record, giving up on saving file.  Error is 28: No space left on "
              "device.\n");
}

TEST_F(RecordFileManagerTest, TheUmaskStays066AfterASave) {
    run([this] {
        umask(0);
        put("a", "1", true);
        struct stat st {};
        stat(_file.c_str(), &st);
        if (umask(0) == 066 && (st.st_mode & 07777) == 0600) fputs("ok", stdout);
    });
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, StepsRefuseANullStream) {
    EXPECT_EQ(run([] {
                  char buf[4] = "abc";
                  store().readLooped(buf, 3, nullptr);
                  if (!store().writeRecord(nullptr, "a", 0, nullptr) && std::string(buf) == "abc") {
                      fputs("ok", stdout);
                  }
              }),
              "Invalid input file passed to readLooped, cannot read.\n"
              "Invalid outFile passed to writeRecord.  Cannot write.\n");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, WriteRecordWritesOneAndTellsWhetherItCould) {
    EXPECT_EQ(run([this] {
                  std::FILE* const file = fopen(_file.c_str(), "wb");
                  if (store().writeRecord(file, "key", 5, "value")) fputs("done", stdout);
                  fclose(file);
                  std::FILE* const full = fopen("/dev/full", "wb");
                  setvbuf(full, nullptr, _IONBF, 0);
                  if (!store().writeRecord(full, "key", 5, "value")) fputs(" refused", stdout);
                  fclose(full);
              }),
              "");
    EXPECT_EQ(_out, "done refused");
    EXPECT_EQ(readFile(_file), record("key", "value"));
}

TEST_F(RecordFileManagerTest, WriteRecordEndsAtTheFirstFailingField) {
    for (unsigned long k = 1; k <= 4; ++k) {
        run([&] {
            std::FILE* const file = fopen(_file.c_str(), "wb");
            const FailNth fault(Call::fwrite, k, ENOSPC);
            if (!store().writeRecord(file, "key", 5, "value") && fault.count() == k)
                fputs("ok", stdout);
            fclose(file);
        });
        EXPECT_EQ(_out, "ok");
        const std::size_t left[] = {0, 4, 7, 11};
        EXPECT_EQ(readFile(_file), record("key", "value").substr(0, left[k - 1]));
    }
}

TEST_F(RecordFileManagerTest, ReadLoopedReadsPiecesOfAThousand) {
    writeFile(_file, std::string(2500, 'x'));
    EXPECT_EQ(run([this] {
                  std::FILE* const file = fopen(_file.c_str(), "rb");
                  std::string buf(2501, '?');
                  const CountCalls reads(Call::fread);
                  store().readLooped(buf.data(), 2500, file);
                  if (reads.count() == 3 && buf == std::string(2500, 'x') + '?')
                      fputs("ok", stdout);
                  fclose(file);
              }),
              "");
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, ReadLoopedReportsEachShortPieceAndLeavesTheRestUntouched) {
    writeFile(_file, std::string(1500, 'x'));
    EXPECT_EQ(run([this] {
                  std::FILE* const file = fopen(_file.c_str(), "rb");
                  std::string buf(3500, '?');
                  store().readLooped(buf.data(), 3500, file);
                  if (buf == std::string(1500, 'x') + std::string(2000, '?')) fputs("ok", stdout);
                  fclose(file);
              }),
              kShort + kShort);
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, ReadLoopedDoesNotCompleteAShortPiece) {
    writeFile(_file, "abcdef" + std::string(1000, 'x'));
    EXPECT_EQ(run([this] {
                  std::FILE* const file = fopen(_file.c_str(), "rb");
                  std::string buf(1003, '?');
                  const ShortNth fault(Call::fread, 1, 2);
                  store().readLooped(buf.data(), 1003, file);
                  if (buf == "ab" + std::string(998, '?') + "cde") fputs("ok", stdout);
                  fclose(file);
              }),
              kShort);
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, ReadLoopedReadsNothingForZero) {
    writeFile(_file, "abc");
    run([this] {
        std::FILE* const file = fopen(_file.c_str(), "rb");
        char c = '?';
        store().readLooped(&c, 0, file);
        if (c == '?' && ftell(file) == 0) fputs("ok", stdout);
        fclose(file);
    });
    EXPECT_EQ(_out, "ok");
}

TEST_F(RecordFileManagerTest, PreloadMergesTheMatchingRecordsOfAnotherFile) {
    writeFile(_dir.file("other"), record("_record-file-version", "9") + record("a1", "x") +
                                      record("b", "y") + record("a2", "z"));
    EXPECT_EQ(run([this] {
                  put("a1", "old");
                  put("c", "kept");
                  store().preload("a", Pathname(_dir.file("other")));
                  store().preload("a", Pathname(_dir.file("missing")));
                  fputs(joined(all()).c_str(), stdout);
              }),
              "");
    EXPECT_EQ(_out, "a1=x;a2=z;c=kept;");
    EXPECT_EQ(readFile(_file), "") << "nothing is saved";
}

TEST_F(RecordFileManagerTest, DestroyingAStoreWhoseLockFailsThrows) {
    run([] {
        const FailNth fault(Call::pthread_mutex_destroy, 1, EBUSY);
        try {
            delete RecordFileManager::instance();
        } catch (const PthreadException& e) {
            fputs(e.what(), stdout);
        }
    });
    EXPECT_EQ(_out,
              "Main Thread: about to throw a PthreadException: pthread_mutex_destroy: Device or "
              "resource busy");
}

TEST_F(RecordFileManagerTest, ManyThreadsMayPut) {
    run([] {
        std::vector<std::thread> threads;
        for (int t = 0; t < 4; ++t) {
            threads.emplace_back([t] {
                for (int i = 0; i < 250; ++i)
                    put(std::to_string(t) + "-" + std::to_string(i), "v");
            });
        }
        for (std::thread& thread : threads)
            thread.join();
        fputs(std::to_string(all().size()).c_str(), stdout);
    });
    EXPECT_EQ(_out, "1000");
}

TEST(ComponentExceptionTest, LogsOnceWhenItIsGivenALogger) {
    const ChildResult result = runInChild([] {
        Logger logger("x");
        const ComponentException quiet("quiet");
        const ComponentException loud(logger, "loud %d");
        const ComponentException copy(loud);
        return std::string(copy.what()) == "loud %d" && std::string(quiet.what()) == "quiet" ? 0
                                                                                             : 1;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "loud %d\n");
}

}  // namespace
