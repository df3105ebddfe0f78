#include "Counters.h"

#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Logger.h>

#include <cstdlib>
#include <memory>
#include <vector>

namespace {

Logger logger("counters");

const std::string kPrefix = "count/";
constexpr std::size_t kMaxNames = 10000;
constexpr std::size_t kMaxLength = 64;

bool isName(const std::string& text) {
    const char* const letters = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-_.";
    return !text.empty() && text.size() <= kMaxLength &&
           text.find_first_not_of(letters) == std::string::npos;
}

RecordFileManager& store() {
    return *RecordFileManager::instance();
}

// Copies of the records whose keys begin with the prefix.
std::map<std::string, std::string> recordsOf(const std::string& prefix) {
    std::vector<PersistentFullData> list;
    store().enumerate(prefix, list);
    std::map<std::string, std::string> records;
    for (const PersistentFullData& record : list) {
        const std::unique_ptr<char[]> key(static_cast<char*>(record._pKey));
        const std::unique_ptr<char[]> value(static_cast<char*>(record._pData));
        records[key.get()].assign(value.get(), record._dataSize);
    }
    return records;
}

void put(const std::string& key, std::string value) {
    PersistentHashData data;
    data._pData = value.data();
    data._size = static_cast<std::uint32_t>(value.size());
    store().put(key, data, false);
}

// In bytes, of a file that holds all of the store.
long long wholeSize() {
    constexpr long long kLengths = 8;  // in front of key and value, 4 bytes each
    long long size = 31;               // the version record
    for (const auto& [key, value] : recordsOf(""))
        size += kLengths + static_cast<long long>(key.size() + value.size());
    return size;
}

}  // namespace

Counters::Counters(const Pathname& directory)
    : _directory(directory), _file(directory / "data"), _new(directory / "data.new") {}

void Counters::load(bool fresh) {
    const ScopedMutex lock(_mutex);
    _directory.mkdir(Pathname::MKDIR_PRIVATE);
    if (fresh) _file.renameTo(_directory / "data.old");
    store().init(xml::node());
    for (const auto& [key, value] : recordsOf(kPrefix))
        _counts[key.substr(kPrefix.size())] = std::strtoull(value.c_str(), nullptr, 10);
    logger.info("loaded %zu counts", _counts.size());
}

bool Counters::add(const std::string& name) {
    const ScopedMutex lock(_mutex);
    if (!isName(name) || (_counts.size() >= kMaxNames && _counts.count(name) == 0)) return false;
    ++_counts[name];
    _changed.insert(name);
    return true;
}

// The store never frees a value that is replaced, so it is given the counts once a save, not each
// time that one changes.
bool Counters::save() {
    const ScopedMutex lock(_mutex);
    if (_changed.empty()) return true;
    for (const std::string& name : _changed)
        put(kPrefix + name, std::to_string(_counts[name]));
    if (!replaceFile()) {
        logger.error("cannot save " + _file + "; it is as it was");
        return false;
    }
    logger.info("saved %zu changed counts", _changed.size());
    _changed.clear();
    return true;
}

// The store rewrites its file in place and does not say whether that went well. So it writes a new
// file, which takes the old one's place once it is seen to be whole and is on the disk.
bool Counters::replaceFile() {
    _new.unlink();  // what a killed process left must not pass for what is saved now
    store().setDBFile(_new);
    store().saveToFile();
    const ScopedFileDescriptor written(_new);
    long long size = 0;
    return written.getSize(&size) && size == wholeSize() && written.sync() == 0 &&
           _new.renameTo(_file);
}
