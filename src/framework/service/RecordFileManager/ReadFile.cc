#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/RecordStream.h"
#include "framework/service/RecordFileManager/StoreLogger.h"
#include "framework/service/RecordFileManager/ValueBlock.h"

#include <string.h>

#include <algorithm>
#include <cstring>
#include <limits>

inline namespace korvex {

namespace {

const char* text(const Block& block) {
    return static_cast<const char*>(block.get());
}

Block allocate(std::uint32_t size, std::size_t extra, const char* purpose) {
    // Where a size_t has 32 bits, the sum may not fit: no such memory then either.
    const bool fits = size <= std::numeric_limits<std::size_t>::max() - extra;
    Block block = fits ? newValueBlock(size + extra) : Block();
    if (!block) throw ComponentException(storeLogger(), purpose);
    return block;
}

}  // namespace

// Reads one record file, record by record.
class KORVEX_HIDDEN RecordFileManager::Loader {
  public:
    Loader(RecordFileManager& store, std::FILE* file) : _store(store), _file(file) {}

    // The next record; false at the end of the file or of what can be read of it.
    bool next();
    bool endWasFlagged() const { return _endWasFlagged; }
    const char* key() const { return _longKey ? text(_longKey) : _key; }
    std::uint32_t size() const { return _size; }
    Block& value() { return _value; }

  private:
    bool readLength(std::uint32_t& length, std::size_t& got);
    void readKey(std::uint32_t size);

    RecordFileManager& _store;
    std::FILE* const _file;
    bool _endWasFlagged = false;
    char _key[256];  // NUL-terminated
    Block _longKey;  // one that does not fit there
    std::uint32_t _size = 0;
    Block _value;
};

bool RecordFileManager::Loader::readLength(std::uint32_t& length, std::size_t& got) {
    unsigned char bytes[kLengthBytes];
    got = std::fread(bytes, 1, sizeof bytes, _file);
    if (got != sizeof bytes) return false;
    length = getLength(bytes);
    return true;
}

// What cannot be read stays zero.
void RecordFileManager::Loader::readKey(std::uint32_t size) {
    char* to = _key;
    _longKey.reset();
    if (size < sizeof _key) {
        std::memset(_key, 0, size + 1);
    } else {
        _longKey = allocate(size, 1, "Unable to allocate memory for reading hash key.");
        to = static_cast<char*>(_longKey.get());
    }
    _store.readLooped(to, size, _file);
}

bool RecordFileManager::Loader::next() {
    _endWasFlagged = std::feof(_file) != 0;
    if (_endWasFlagged) return false;
    std::uint32_t keySize = 0;
    std::size_t got = 0;
    if (!readLength(keySize, got)) {
        // Nothing at all, at the end, is how a whole file ends.
        if (got != 0 || std::feof(_file) == 0) {
            storeLogger().error("Short read for key length, record file may be corrupt.");
        }
        return false;
    }
    readKey(keySize);
    if (!readLength(_size, got)) {
        storeLogger().error("Short read for value length, record file may be corrupt.");
        return false;
    }
    _value = allocate(_size, 0, "Unable to allocate memory for reading hash value.");
    _store.readLooped(static_cast<char*>(_value.get()), _size, _file);
    return true;
}

void RecordFileManager::readFile() {
    load(dbHomePath, "", fileVersion);
}

void RecordFileManager::preload(const std::string& prefix, const Pathname& file) {
    std::string version;
    load(file, prefix, version);
}

void RecordFileManager::load(const Pathname& file, const std::string& prefix,
                             std::string& version) {
    const RecordStream stream(file.fopen("rb"));
    if (!stream) return;
    Loader loader(*this, stream.get());
    while (loader.next()) {
        std::string key(loader.key());
        if (isVersionKey(key)) {
            version.assign(text(loader.value()), strnlen(text(loader.value()), loader.size()));
        } else if (key.compare(0, prefix.size(), prefix) == 0) {
            const ScopedMutex lock(_mutex);
            insert(std::move(key), loader.size(), loader.value().get());
            static_cast<void>(loader.value().release());
        }
    }
    // Only where a value was cut short is the end known before it is looked for; a whole file
    // without a version is let pass.
    if (loader.endWasFlagged() && version.empty()) {
        throw ComponentException(storeLogger(),
                                 "No version string found in hash db.  File has been modified or "
                                 "was never migrated.");
    }
}

void RecordFileManager::readLooped(char* buf, unsigned int readLen, std::FILE* inFile) {
    constexpr unsigned int kChunk = 1000;
    if (inFile == nullptr) {
        storeLogger().error("Invalid input file passed to readLooped, cannot read.");
        return;
    }
    // A chunk that came short is not completed: the next one goes to its own place. Its end never
    // lies beyond the buffer's.
    for (std::size_t at = 0; at < readLen; at += kChunk) {
        const std::size_t wanted = std::min<std::size_t>(readLen - at, kChunk);
        const std::size_t got = std::fread(buf + at, 1, wanted, inFile);
        if (got != wanted) storeLogger().error("Short read, record file may be corrupt.");
        if (got == 0) return;
    }
}

}  // namespace korvex
