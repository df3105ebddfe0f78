#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include "base/Stream.h"
#include "framework/service/RecordFileManager/Pieces.h"
#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/RecordReader.h"
#include "framework/service/RecordFileManager/State.h"

#include <string.h>

#include <string>
#include <utility>

inline namespace korvex {

namespace {

std::string_view upToNul(std::string_view text) {
    return text.substr(0, strnlen(text.data(), text.size()));
}

// Without a block, and without a message, if the file cannot be opened.
FileBytes bytesOf(const Pathname& file) {
    const Stream stream(file.fopen("rb"));
    if (!stream) return FileBytes();
    FileBytes bytes = readToEnd(stream.get());
    if (!bytes.block) {
        throw ComponentException(storeLogger(), "Unable to allocate memory for reading hash key.");
    }
    return bytes;
}

// Enters the wanted ones of the records that are read.
class Loader {
  public:
    Loader(StoredRecords& records, FileBytes bytes, const std::string& prefix, std::string& version)
        : _records(records), _bytes(std::move(bytes)), _prefix(prefix), _version(version) {}

    void take(const RecordReader& read);

  private:
    static void reportShort(const RecordReader& read) {
        reportShortReads(read.valueSize(), read.value().size());
    }
    void enterWhereItLies(const RecordReader& read);
    void enterCopy(const RecordReader& read, std::string_view key);

    StoredRecords& _records;
    FileBytes _bytes;                          // until they are kept
    StoredRecords::KeptFile* _file = nullptr;  // from then on
    const std::string& _prefix;
    std::string& _version;
};

void Loader::take(const RecordReader& read) {
    const std::string_view key = upToNul(read.key());
    if (isVersionKey(key)) {
        reportShort(read);
        _version = upToNul(read.value());
    } else if (key.substr(0, _prefix.size()) != _prefix) {
        reportShort(read);
    } else if (_prefix.empty() && key.size() == read.key().size() && !read.valueIsCut()) {
        enterWhereItLies(read);
    } else {
        // If only some records of a file are wanted, its bytes are not kept.
        enterCopy(read, key);
    }
}

void Loader::enterWhereItLies(const RecordReader& read) {
    if (_file == nullptr) _file = &_records.keep(std::move(_bytes));
    _records.put(*_file, read.record());
}

void Loader::enterCopy(const RecordReader& read, std::string_view key) {
    Block copy = newRecord(key, read.valueSize(), read.value());
    if (!copy) {
        throw ComponentException(
            storeLogger(), read.valueIsCut() ? "Unable to allocate memory for reading hash value."
                                             : "Unable to allocate memory for storing hash value.");
    }
    reportShort(read);
    _records.put(std::move(copy));
}

}  // namespace

void RecordFileManager::readFile() {
    load(_state->file, "", _state->version);
}

void RecordFileManager::preload(const std::string& prefix, const Pathname& file) {
    std::string version;
    load(file, prefix, version);
}

void RecordFileManager::load(const Pathname& file, const std::string& prefix,
                             std::string& version) {
    FileBytes bytes = bytesOf(file);
    if (!bytes.block) return;
    RecordReader reader(bytes);
    const ScopedMutex lock(_mutex);
    Loader loader(_state->records, std::move(bytes), prefix, version);
    while (reader.next())
        loader.take(reader);
    // A complete file without a version is accepted.
    if (reader.endedInAValue() && version.empty()) {
        throw ComponentException(storeLogger(),
                                 "No version string found in hash db.  File has been modified or "
                                 "was never migrated.");
    }
}

void RecordFileManager::readLooped(char* buf, unsigned int readLen, std::FILE* inFile) {
    if (inFile == nullptr) {
        storeLogger().error("Invalid input file passed to readLooped, cannot read.");
        return;
    }
    readPieces(readLen, [buf, inFile](std::size_t at, std::size_t wanted) {
        return std::fread(buf + at, 1, wanted, inFile);
    });
}

}  // namespace korvex
