#pragma once

#include <korvex/Export.h>
#include <korvex/util/Pathname.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class RecordFileManager;

// The process's record store with strings for values: nothing to free, and a save that tells
// whether it succeeded. What is put or removed is in memory; save() rewrites the file.
//
// A plain value: every object means the one store, which RecordFileManager::instance() is too. All
// messages go to the logger "recordFileManager".
//
// Threads: after open(), any thread may call anything here at any time. Calls of RecordFileManager
// other than put() are not part of that. A child of fork(2) may use its copy of the store,
// whatever the parent's other threads were doing here; its file is the parent's still, so it should
// open its own.
class StringStore {
  public:
    // One record, copied out of the store.
    struct Record {
        std::string key;
        std::string value;
    };

    // Adds the records of the file hashDb/data below LoaderInfo's database directory, or of the one
    // that is named, to those in memory; save() will write it. A file that is not there has none;
    // its directory must be there when it is saved. Damage is logged, as
    // RecordFileManager::readFile() says. Throws ComponentException when memory for the file runs
    // out, and when it is cut and has no version. To be called before other threads use the store.
    static StringStore open();
    static StringStore open(const Pathname& file);

    // A copy of the value; nothing when the key is absent. A value of no bytes is a value.
    std::optional<std::string> get(std::string_view key) const;
    // Copies of the records whose keys begin with the prefix, in byte-wise key order.
    std::vector<Record> list(std::string_view prefix = "") const;

    // Stores a copy of the value, in place of the one that the key had. False, and nothing stored,
    // for a key that would not come back from the file: one with a NUL byte, or beginning with
    // "_record-file-version" in upper or lower case. Throws ComponentException when memory runs
    // out, the store being as it was.
    bool put(std::string_view key, std::string_view value);
    // Whether there was such a record.
    bool remove(std::string_view key);

    // Rewrites the file. False when that failed: it is logged, errno tells why, and the file is a
    // beginning of what was to be saved, or as it was if it could not be opened. Memory is whole,
    // so another save() may succeed. See RecordFileManager::saveToFile() for the umask.
    bool save() const;

  private:
    explicit StringStore(RecordFileManager& store) : _store(&store) {}

    RecordFileManager* _store;
};

}  // KORVEX_NAMESPACE(korvex)
