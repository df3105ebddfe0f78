#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <map>
#include <new>
#include <string>

#include "framework/service/StoreSteps.h"
#include "support/Child.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using namespace storesteps;
using testing::HasSubstr;
using testing::UnorderedElementsAre;
using testsupport::Call;
using testsupport::ownStderr;
using testsupport::readFile;
using testsupport::sweep;
using testsupport::SweptFault;
using testsupport::TempDir;
using testsupport::writeFile;

// Values that take one piece, more than one, and no byte; one that is larger than what a save
// stages.
std::map<std::string, std::string> sampleRecords() {
    std::map<std::string, std::string> records;
    records["large"] = std::string(200000, 'L');
    for (unsigned i = 0; i < 2 * testsupport::testScale(); ++i) {
        const std::string n = std::to_string(i);
        records["long" + n] = std::string(2500, 'l');
        records["short" + n] = "value " + n;
        records["void" + n] = "";
        records[std::string(300, 'k') + n] = "long key";
    }
    return records;
}

std::string fileOf(const std::map<std::string, std::string>& records) {
    std::string content = kVersionRecord;
    for (const auto& [key, value] : records)
        content += record(key, value);
    return content;
}

// A value of which the end could not be read is zero from there on.
bool isReadInPart(const std::string& got, const std::string& whole) {
    if (got.size() != whole.size()) return false;
    for (std::size_t i = 0; i < got.size(); ++i) {
        if (got[i] != whole[i] && got[i] != '\0') return false;
    }
    return true;
}

bool isBeginning(const std::string& part, const std::string& whole) {
    return whole.compare(0, part.size(), part) == 0;
}

class RecordFileSweep : public testing::Test {
  protected:
    RecordFileSweep() { store().setDBFile(Pathname(_file)); }

    // Both work under the fault; whether they ended without an exception.
    static bool load(SweptFault& fault) {
        bool done = true;
        fault.arm();
        try {
            store().readFile();
        } catch (const ComponentException&) {
            done = false;
        } catch (const std::bad_alloc&) {
            done = false;
        }
        fault.disarm();
        return done;
    }
    static bool save(SweptFault& fault) {
        bool done = true;
        fault.arm();
        try {
            put("added", "new", true);
        } catch (const ComponentException&) {
            done = false;
        } catch (const std::bad_alloc&) {
            done = false;
        }
        fault.disarm();
        return done;
    }

    TempDir _dir;
    const std::string _file = _dir.file("data");
    const std::map<std::string, std::string> _records = sampleRecords();
};

TEST_F(RecordFileSweep, LoadingKeepsWhatWasThereAndTellsWhatIsMissing) {
    const std::string content = fileOf(_records);
    writeFile(_file, content);
    const auto swept =
        sweep("load", {Call::fopen, Call::fread, Call::fclose, Call::calloc, Call::allocation},
              [&](SweptFault& fault) {
                  put("mine", "kept");
                  const bool done = load(fault);
                  const bool told = !done || !ownStderr().empty() || fault.isOf(Call::fopen);
                  EXPECT_EQ(get("mine"), "kept");
                  for (const auto& [key, value] : _records) {
                      const std::string got = get(key);
                      if (got != value) {
                          EXPECT_TRUE(told) << key;
                      }
                      if (got != "(absent)") {
                          EXPECT_TRUE(isReadInPart(got, value)) << key;
                      }
                  }
                  EXPECT_EQ(readFile(_file), content);
                  store().readFile();
                  for (const auto& [key, value] : _records)
                      EXPECT_EQ(get(key), value);
              });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::fopen, Call::fread, Call::fclose,
                                                  Call::calloc, Call::allocation));
    EXPECT_GT(swept.points, 20U);
}

TEST_F(RecordFileSweep, SavingTouchesNoRecordAndTellsWhenTheFileIsNotWhole) {
    const std::string old = fileOf({{"old", "content"}});
    auto after = _records;
    after["added"] = "new";
    const std::string whole = fileOf(after);
    const auto swept =
        sweep("save", {Call::fopen, Call::fwrite, Call::fclose, Call::calloc, Call::allocation},
              [&](SweptFault& fault) {
                  for (const auto& [key, value] : _records)
                      put(key, value);
                  writeFile(_file, old);
                  const bool done = save(fault);
                  const std::string content = readFile(_file);
                  EXPECT_TRUE(content == old || isBeginning(content, whole));
                  if (done && content != whole) {
                      EXPECT_NE(ownStderr(), "");
                  }
                  for (const auto& [key, value] : _records)
                      EXPECT_EQ(get(key), value);
                  put("added", "new", true);
                  EXPECT_EQ(readFile(_file), whole);
              });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::fopen, Call::fwrite, Call::fclose,
                                                  Call::calloc, Call::allocation));
    EXPECT_GT(swept.points, 30U);
}

TEST_F(RecordFileSweep, AFileThatCannotBeOpenedForWritingIsToldWithTheErrorOfTheOpening) {
    ASSERT_EQ(mkdir(_file.c_str(), 0700), 0);
    const auto swept = sweep("open", {Call::allocation, Call::new_array}, [&](SweptFault& fault) {
        if (!save(fault)) return;
        // Without memory for its line even the message is lost.
        const std::string told = ownStderr();
        if (!told.empty() || fault.isOf(Call::new_array)) {
            EXPECT_THAT(told, HasSubstr("Error is 21: Is a directory."));
        }
    });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::allocation, Call::new_array));
}

}  // namespace
