#pragma once

#include "framework/service/RecordFileManager/FileBytes.h"
#include "framework/service/RecordFileManager/RecordBlock.h"
#include "framework/service/RecordFileManager/RecordTable.h"

#include <functional>
#include <map>
#include <vector>

inline namespace korvex {

// The records and their memory. A record that was put has a block of its own; a record that was
// loaded is in the block of its file. A replaced value is kept, because some callers use values
// longer than the store does. It stays reachable from here.
class StoredRecords {
  public:
    struct KeptFile {
        FileBytes bytes;
        std::size_t records = 0;  // those that were replaced included
    };

    const RecordTable& table() const { return _table; }
    // Calls that throw std::bad_alloc leave the records unchanged.
    void put(Block record);
    // Keeps a file's bytes, for records to lie in. They are freed with the last of these.
    KeptFile& keep(FileBytes bytes);
    // A record in such bytes.
    void put(KeptFile& file, const char* record);
    // False when the key is absent.
    bool remove(std::string_view key);

  private:
    using KeptFiles = std::map<const char*, KeptFile, std::less<>>;  // by their first byte

    void enter(const char* record);
    // The file that holds a record; the end iterator if the record has a block of its own.
    KeptFiles::iterator fileOf(const char* record);

    RecordTable _table;
    KeptFiles _files;
    std::vector<const char*> _replaced;  // of those with blocks of their own
};

}  // namespace korvex
