#pragma once

#include <korvex/Export.h>
#include <korvex/util/Pathname.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class RecordFileManager;

// The record store of the process, with values as strings: nothing must be freed, and save()
// returns whether it succeeded. put() and remove() change memory only; save() rewrites the file.
//
// A plain value: all objects refer to the one store, which is also RecordFileManager::instance().
// All messages go to the logger "recordFileManager".
//
// Threads: after open(), any thread may call any member here at any time. That does not hold for
// calls of RecordFileManager other than put().
//
// Fork: a child of fork(2) may use its copy of the store, whatever other threads of the parent did
// here. It should open a file of its own, because it still has the name of the parent's file.
class StringStore {
  public:
    // One record, copied out of the store.
    struct Record {
        std::string key;    // without a NUL byte
        std::string value;  // any bytes
    };

    // Names a file, which save() will write, and adds its records to those in memory. Without an
    // argument it is hashDb/data below LoaderInfo's database directory. A file that does not exist
    // has no records; its directory must exist when it is saved. Damage is logged as
    // RecordFileManager::readFile() says. Throws ComponentException if memory for the file runs
    // out, and if a value is cut short and no version record came before it. Call it before other
    // threads use the store.
    static StringStore open();
    static StringStore open(const Pathname& file);

    // A copy of the value, or std::nullopt if the key is absent. A value may be empty.
    std::optional<std::string> get(std::string_view key) const;
    // Copies of the records whose keys begin with the prefix, in byte-wise key order.
    std::vector<Record> list(std::string_view prefix = "") const;

    // Stores a copy of the value, in place of the present value of the key. False, with nothing
    // stored, for a key that could not be loaded from the file again: one that has a NUL byte, or
    // that begins with "_record-file-version" in upper or lower case. Throws ComponentException if
    // memory runs out; then the store is unchanged.
    bool put(std::string_view key, std::string_view value);
    // Removes the record. Returns whether there was one.
    bool remove(std::string_view key);

    // Rewrites the file. False on failure: errno has the reason, which is also logged. Then the
    // file holds only the first part of the new content; if it could not be opened, it is
    // unchanged. Memory does not change, so a later save() may succeed. See
    // RecordFileManager::saveToFile() about the umask.
    bool save() const;

  private:
    explicit StringStore(RecordFileManager& store) : _store(&store) {}

    RecordFileManager* _store;
};

}  // KORVEX_NAMESPACE(korvex)
