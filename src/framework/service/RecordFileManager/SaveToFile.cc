#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include "base/ErrnoKeeper.h"
#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/StagedFile.h"
#include "framework/service/RecordFileManager/State.h"
#include "framework/service/RecordFileManager/StoreLogger.h"

#include <sys/stat.h>

#include <cerrno>
#include <limits>
#include <optional>

inline namespace korvex {

namespace {

// Calls write(bytes, count) for each field of a record, for as long as that returns true.
template <class Write>
bool writeFields(std::string_view key, std::uint32_t size, const void* data, Write write) {
    if (key.size() > std::numeric_limits<std::uint32_t>::max()) {
        errno = EFBIG;  // the file's lengths have 32 bits
        return false;
    }
    unsigned char keyLength[kLengthBytes];
    unsigned char valueLength[kLengthBytes];
    putLength(keyLength, static_cast<std::uint32_t>(key.size()));
    putLength(valueLength, size);
    return write(keyLength, kLengthBytes) && write(key.data(), key.size()) &&
           write(valueLength, kLengthBytes) && write(data, size);
}

bool writeVersion(StagedFile& file) {
    return writeFields(VERSION_KEY, VERSION_STR.size(), VERSION_STR.data(),
                       [&file](const void* p, std::size_t n) { return file.write(p, n); });
}

// Fields that are adjacent in memory are written together.
bool writeRecords(StagedFile& file, const RecordTable& table) {
    const char* begin = nullptr;
    const char* end = nullptr;
    const auto write = [&] { return file.write(begin, static_cast<std::size_t>(end - begin)); };
    bool written = true;
    table.walk("", [&](RecordView record) {
        if (record.begin() != end) {
            written = write();
            begin = record.begin();
        }
        end = record.begin() + record.size();
        return written;
    });
    return written && write();
}

}  // namespace

// The key comes by value because that is the interface.
// NOLINTNEXTLINE(performance-unnecessary-value-param)
bool RecordFileManager::writeRecord(std::FILE* outFile, std::string key, unsigned int dataLen,
                                    const void* data) {
    if (outFile == nullptr) {
        storeLogger().error("Invalid outFile passed to writeRecord.  Cannot write.");
        return false;
    }
    return writeFields(key, dataLen, data, [outFile](const void* p, std::size_t n) {
        return n == 0 || std::fwrite(p, 1, n, outFile) == n;
    });
}

void RecordFileManager::saveToFile() {
    save();
}

bool RecordFileManager::save() const {
    storeLogger().debug("Writing record file to disk.");
    if (_state->file.empty()) {
        throw ComponentException(storeLogger(), "Tried to write to db without setting filename.");
    }
    umask(066);                         // only the owner may read the records; never set back
    std::optional<ErrnoKeeper> keeper;  // of the failed call's, through the file's closing
    StagedFile file(_state->file);
    if (!file) {
        keeper.emplace();
        __extension__ storeLogger().error(
            "Unable to open record file for writing at '%s'.  Cannot save hash data.  Error is "
            "%d: %m.",
            _state->file.c_str(), errno);
        return false;
    }
    // If the disk is full, the close fails at the latest.
    if (writeVersion(file) && writeRecords(file, _state->records.table()) && file.close())
        return true;
    keeper.emplace();
    __extension__ storeLogger().error(
        "Failed to write record, giving up on saving file.  Error is %d: %m.", errno);
    return false;
}

}  // namespace korvex
