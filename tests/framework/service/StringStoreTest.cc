#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/StringStore.h>
#include <korvex/util/LoaderInfo.h>

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/Faults.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using storesteps::kVersionRecord;
using storesteps::record;
using testsupport::Call;
using testsupport::ChildResult;
using testsupport::FailNth;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::testScale;
using testsupport::writeFile;

std::string textOf(const std::vector<StringStore::Record>& records) {
    std::string text;
    for (const StringStore::Record& record : records)
        text += record.key + "=" + record.value + ";";
    return text;
}

class StringStoreTest : public testing::Test {
  protected:
    // Whether body is true in a process with a store of its own; what that logs.
    std::string run(const std::function<bool(StringStore)>& body, unsigned seconds = 60) {
        const ChildResult result =
            runInChild([&] { return body(StringStore::open(Pathname(_file))) ? 0 : 1; }, seconds);
        EXPECT_EQ(result.status, 0) << "signal " << result.signal << ": " << result.err;
        return result.err;
    }

    TempDir _dir;
    const std::string _file = _dir.file("data");
};

TEST_F(StringStoreTest, WhatWasPutIsThere) {
    const std::string bytes("a\0\xff\n", 4);
    EXPECT_EQ(run([&](StringStore store) {
                  return !store.get("a") && store.put("a", "1") && store.put("a", bytes) &&
                         store.put("", "") && store.get("a") == bytes && store.get("") == "" &&
                         !store.get("b") && readFile(_file).empty();
              }),
              "");
}

TEST_F(StringStoreTest, RecordsAreListedInKeyOrderByPrefix) {
    run([](StringStore store) {
        for (const char* key : {"abc", "ab", "a", "AB", "b"})
            store.put(key, std::string("of ") + key);
        return textOf(store.list("ab")) == "ab=of ab;abc=of abc;" &&
               textOf(store.list()) == "AB=of AB;a=of a;ab=of ab;abc=of abc;b=of b;" &&
               store.list("ac").empty();
    });
}

TEST_F(StringStoreTest, RemoveTellsWhetherThereWasOne) {
    run([this](StringStore store) {
        store.put("a", "1");
        return !store.remove("b") && store.remove("a") && !store.remove("a") && !store.get("a") &&
               readFile(_file).empty();
    });
}

TEST_F(StringStoreTest, WhatIsSavedIsReadBack) {
    run([](StringStore store) {
        store.put("b", "2");
        store.put("a", "1");
        return store.save();
    });
    EXPECT_EQ(readFile(_file), kVersionRecord + record("a", "1") + record("b", "2"));
    run([](StringStore store) { return textOf(store.list()) == "a=1;b=2;"; });
}

TEST_F(StringStoreTest, KeysThatWouldNotComeBackAreRefused) {
    EXPECT_EQ(run([](StringStore store) {
                  return !store.put(std::string("a\0b", 3), "1") &&
                         !store.put(std::string("\0", 1), "1") &&
                         !store.put("_record-file-version", "1") &&
                         !store.put("_Record-File-VERSION.x", "1") &&
                         store.put("_record-file-versio", "1") && store.list().size() == 1;
              }),
              "");
}

TEST_F(StringStoreTest, TheDefaultFileIsBelowTheDatabaseDirectory) {
    ASSERT_EQ(mkdir(_dir.file("hashDb").c_str(), 0700), 0);
    writeFile(_dir.file("hashDb/data"), kVersionRecord + record("a", "1"));
    const ChildResult result = runInChild([&] {
        setenv("KORVEX_DB", _dir.path().c_str(), 1);
        LoaderInfo::getInstance()->populateFromEnvironment();
        StringStore store = StringStore::open();
        return store.get("a") == "1" && store.put("b", "2") && store.save() ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(readFile(_dir.file("hashDb/data")),
              kVersionRecord + record("a", "1") + record("b", "2"));
}

TEST_F(StringStoreTest, AllObjectsAreTheOneStore) {
    run([this](StringStore store) {
        storesteps::put("a", "1");
        const StringStore copy = store;
        store.put("b", "2");
        writeFile(_dir.file("other"), kVersionRecord + record("c", "3"));
        const StringStore other = StringStore::open(Pathname(_dir.file("other")));
        return store.get("a") == "1" && copy.get("b") == "2" && storesteps::get("b") == "2" &&
               store.get("c") == "3" && other.get("a") == "1";
    });
}

TEST_F(StringStoreTest, ASaveThatCannotOpenTheFileSaysSo) {
    ASSERT_EQ(mkdir(_file.c_str(), 0700), 0);
    EXPECT_EQ(run([](StringStore store) {
                  store.put("a", "1");
                  errno = 0;
                  return !store.save() && errno == EISDIR && store.get("a") == "1";
              }),
              // the opening reads it, too
              "Short read for key length, record file may be corrupt.\n"
              "Unable to open record file for writing at '" +
                  _file + "'.  Cannot save hash data.  Error is 21: Is a directory.\n");
}

TEST_F(StringStoreTest, ASaveThatFailsSaysSoWithTheFirstError) {
    const std::string message = "Failed to write record, giving up on saving file.  Error is ";
    EXPECT_EQ(run([](StringStore store) {
                  store.put("a", "1");
                  const FailNth write(Call::fwrite, 1, ENOSPC);
                  const FailNth close(Call::fclose, 1, EIO);
                  errno = 0;
                  return !store.save() && errno == ENOSPC && write.fired() && close.fired();
              }),
              message + "28: No space left on device.\n");
    EXPECT_EQ(run([](StringStore store) {
                  store.put("a", "1");
                  const FailNth close(Call::fclose, 1, EIO);
                  errno = 0;
                  return !store.save() && errno == EIO;
              }),
              message + "5: Input/output error.\n");
    EXPECT_EQ(run([](StringStore store) {
                  store.put("a", "1");
                  {
                      const FailNth write(Call::fwrite, 1, ENOSPC);
                      if (store.save()) return false;
                  }
                  return store.save();
              }),
              message + "28: No space left on device.\n");
    EXPECT_EQ(readFile(_file), kVersionRecord + record("a", "1"));
}

TEST_F(StringStoreTest, PutWithoutMemoryThrowsAndChangesNothing) {
    run([](StringStore store) {
        store.put("a", "1");
        try {
            const FailNth fault(Call::calloc, 1, ENOMEM);
            store.put("a", "2");
        } catch (const ComponentException& e) {
            return std::string(e.what()) == "Unable to allocate memory for storing hash value." &&
                   store.get("a") == "1";
        }
        return false;
    });
}

// All of it at once, with forks besides.
TEST_F(StringStoreTest, AnyThreadAndAnyChildMayDoAnything) {
    const unsigned times = 200 * testScale();
    run(
        [&](StringStore store) {
            std::atomic<bool> stop{false};
            std::atomic<bool> well{true};
            std::vector<std::thread> threads;
            for (unsigned t = 0; t < 3; ++t) {
                threads.emplace_back([&, t]() mutable {
                    const std::string own = "own" + std::to_string(t);
                    for (unsigned i = 0; !stop; ++i) {
                        const std::string value = std::to_string(i);
                        store.put(own, value);
                        store.put("shared", value);
                        if (store.get(own) != value || store.list("own").empty()) well = false;
                        if (i % 8 == 0 && !store.save()) well = false;
                        if (!store.remove(own)) well = false;
                        std::this_thread::sleep_for(std::chrono::microseconds(50));
                    }
                });
            }
            for (unsigned i = 0; i < times; ++i) {
                const pid_t child = fork();
                if (child == 0) {
                    StringStore mine = StringStore::open(Pathname(_dir.file("child")));
                    const bool done = mine.put("mine", "1") && mine.save() &&
                                      mine.get("mine") == "1" && mine.remove("mine");
                    _exit(done ? 0 : 1);
                }
                int status = -1;
                if (waitpid(child, &status, 0) != child || status != 0) well = false;
            }
            stop = true;
            for (std::thread& thread : threads)
                thread.join();
            return well && store.save();
        },
        110 * testScale());
    run([](StringStore store) { return store.list().size() == 1 && store.get("shared"); });
}

}  // namespace
