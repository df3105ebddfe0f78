#include "framework/service/RecordFileManager/FileBytes.h"

#include <sys/stat.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <limits>

inline namespace korvex {

namespace {

constexpr std::size_t kSmallest = 4096;  // bytes, where the size is not known before
constexpr std::size_t kMost = std::numeric_limits<std::size_t>::max();

// One more byte than expected, so that the end of the file is seen.
std::size_t firstCapacity(std::FILE* file) {
    struct stat st {};
    if (fstat(fileno(file), &st) != 0 || !S_ISREG(st.st_mode)) return kSmallest;
    const auto size = static_cast<std::uint64_t>(st.st_size);
    return size < kMost ? static_cast<std::size_t>(size) + 1 : kMost;
}

// False, with the bytes unchanged, if there is no memory.
bool resize(FileBytes& bytes, std::size_t capacity) {
    Block larger = newBlock(capacity);
    if (!larger) return false;
    if (bytes.size > 0) std::memcpy(larger.get(), bytes.begin(), bytes.size);
    bytes.block = std::move(larger);
    return true;
}

}  // namespace

FileBytes readToEnd(std::FILE* file) {
    static_cast<void>(std::setvbuf(file, nullptr, _IONBF, 0));
    FileBytes bytes;
    std::size_t capacity = firstCapacity(file);
    for (;;) {
        if (!resize(bytes, capacity)) return FileBytes();
        bytes.size += std::fread(bytes.block.get() + bytes.size, 1, capacity - bytes.size, file);
        if (bytes.size < capacity) break;
        capacity = capacity > kMost / 2 ? kMost : std::max(2 * capacity, kSmallest);
    }
    bytes.metTheEnd = std::feof(file) != 0;
    return bytes;
}

}  // namespace korvex
