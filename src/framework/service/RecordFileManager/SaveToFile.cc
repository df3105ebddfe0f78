#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/RecordStream.h"
#include "framework/service/RecordFileManager/StoreLogger.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <limits>

inline namespace korvex {

namespace {

bool writeBytes(std::FILE* file, const void* p, std::size_t n) {
    return n == 0 || std::fwrite(p, 1, n, file) == n;
}

// Both lengths, the key between them. Written in one piece, as all but the longest keys are, this
// takes a seventh off saving 100 records, a quarter off saving 10,000.
bool writeHead(std::FILE* file, std::string_view key, std::uint32_t size) {
    unsigned char keyLength[kLengthBytes];
    unsigned char valueLength[kLengthBytes];
    putLength(keyLength, static_cast<std::uint32_t>(key.size()));
    putLength(valueLength, size);
    char head[256];
    if (key.size() > sizeof head - 2 * kLengthBytes) {
        return writeBytes(file, keyLength, kLengthBytes) &&
               writeBytes(file, key.data(), key.size()) &&
               writeBytes(file, valueLength, kLengthBytes);
    }
    std::memcpy(head, keyLength, kLengthBytes);
    std::memcpy(head + kLengthBytes, key.data(), key.size());
    std::memcpy(head + kLengthBytes + key.size(), valueLength, kLengthBytes);
    return writeBytes(file, head, 2 * kLengthBytes + key.size());
}

bool writeFields(std::FILE* file, std::string_view key, std::uint32_t size, const void* data) {
    if (key.size() > std::numeric_limits<std::uint32_t>::max()) {
        errno = EFBIG;  // the file's lengths have 32 bits
        return false;
    }
    return writeHead(file, key, size) && writeBytes(file, data, size);
}

void reportFailedWrite() {
    __extension__ storeLogger().error(
        "Failed to write record, giving up on saving file.  Error is %d: %m.", errno);
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
    return writeFields(outFile, key, dataLen, data);
}

void RecordFileManager::saveToFile() {
    storeLogger().debug("Writing record file to disk.");
    if (dbHomePath.empty()) {
        throw ComponentException(storeLogger(), "Tried to write to db without setting filename.");
    }
    umask(066);  // the records are nobody else's business; never set back
    RecordStream file(dbHomePath.fopen("wb"));
    if (!file) {
        __extension__ storeLogger().error(
            "Unable to open record file for writing at '%s'.  Cannot save hash data.  Error is "
            "%d: %m.",
            dbHomePath.c_str(), errno);
        return;
    }
    writeFields(file.get(), VERSION_KEY, static_cast<std::uint32_t>(VERSION_STR.size()),
                VERSION_STR.data());
    for (const auto& [key, value] : records) {
        if (writeFields(file.get(), key, value.first, value.second)) continue;
        reportFailedWrite();
        std::clearerr(file.get());
        return;
    }
    // A full disk shows here at the latest.
    if (!file.close()) reportFailedWrite();
}

}  // namespace korvex
