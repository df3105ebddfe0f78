#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/StringStore.h>

#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/State.h"

#include <xmlwrapp/node.h>

inline namespace korvex {

StringStore StringStore::open() {
    RecordFileManager& store = *RecordFileManager::instance();
    store.init(xml::node());
    return StringStore(store);
}

StringStore StringStore::open(const Pathname& file) {
    RecordFileManager& store = *RecordFileManager::instance();
    store.setDBFile(file);
    store.readFile();
    return StringStore(store);
}

std::optional<std::string> StringStore::get(std::string_view key) const {
    const ScopedMutex lock(_store->_mutex);
    const char* const found = _store->_state->records.table().find(key);
    if (found == nullptr) return std::nullopt;
    return std::string(RecordView(found).value());
}

std::vector<StringStore::Record> StringStore::list(std::string_view prefix) const {
    const ScopedMutex lock(_store->_mutex);
    std::vector<Record> records;
    _store->_state->records.table().walk(prefix, [&records](RecordView record) {
        records.push_back({std::string(record.key()), std::string(record.value())});
        return true;
    });
    return records;
}

bool StringStore::put(std::string_view key, std::string_view value) {
    if (isVersionKey(key) || key.find('\0') != std::string_view::npos) return false;
    const ScopedMutex lock(_store->_mutex);
    _store->enter(key, value);
    return true;
}

bool StringStore::remove(std::string_view key) {
    const ScopedMutex lock(_store->_mutex);
    return _store->_state->records.remove(key);
}

bool StringStore::save() const {
    const ScopedMutex lock(_store->_mutex);
    return _store->save();
}

}  // namespace korvex
