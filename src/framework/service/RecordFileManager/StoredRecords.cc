#include "framework/service/RecordFileManager/StoredRecords.h"

#include <iterator>
#include <utility>

inline namespace korvex {

StoredRecords::KeptFiles::iterator StoredRecords::fileOf(const char* record) {
    const auto after = _files.upper_bound(record);
    if (after == _files.begin()) return _files.end();
    const auto file = std::prev(after);
    return std::less<>()(record, file->second.bytes.end()) ? file : _files.end();
}

void StoredRecords::enter(const char* record) {
    // Made first, so that what follows the table's change cannot fail.
    if (_replaced.size() == _replaced.capacity()) _replaced.reserve(2 * _replaced.size() + 1);
    const char* const old = _table.put(record);
    if (old != nullptr && fileOf(old) == _files.end()) _replaced.push_back(old);
}

void StoredRecords::put(Block record) {
    enter(record.get());
    static_cast<void>(record.release());
}

StoredRecords::KeptFile& StoredRecords::keep(FileBytes bytes) {
    const char* const begin = bytes.begin();
    return _files.emplace(begin, KeptFile{std::move(bytes)}).first->second;
}

void StoredRecords::put(KeptFile& file, const char* record) {
    enter(record);
    ++file.records;
}

bool StoredRecords::remove(std::string_view key) {
    const char* const record = _table.find(key);
    if (record == nullptr) return false;
    _table.erase(key);
    const auto file = fileOf(record);
    if (file == _files.end()) {
        std::free(const_cast<char*>(record));
    } else if (--file->second.records == 0) {
        _files.erase(file);
    }
    return true;
}

}  // namespace korvex
