#include "framework/service/RecordFileManager/RecordBlock.h"

#include "framework/service/RecordFileManager/RecordFormat.h"

#include <algorithm>
#include <cstring>
#include <limits>

inline namespace korvex {

namespace {

constexpr std::uint32_t kLongest = std::numeric_limits<std::uint32_t>::max();  // bytes

char* copied(char* to, std::string_view bytes) {
    if (!bytes.empty()) std::memcpy(to, bytes.data(), bytes.size());
    return to + bytes.size();
}

char* withLength(char* to, std::size_t length) {
    unsigned char bytes[kLengthBytes];
    putLength(bytes, static_cast<std::uint32_t>(length));
    std::memcpy(to, bytes, kLengthBytes);
    return to + kLengthBytes;
}

}  // namespace

Block newBlock(std::size_t size) {
    return Block(static_cast<char*>(std::calloc(std::max<std::size_t>(size, 1), 1)));
}

Block newRecord(std::string_view key, std::string_view value) {
    if (value.size() > kLongest) return Block();
    return newRecord(key, static_cast<std::uint32_t>(value.size()), value);
}

Block newRecord(std::string_view key, std::uint32_t valueSize, std::string_view valueBegin) {
    if (key.size() > kLongest) return Block();
    const std::uint64_t size = 2 * std::uint64_t{kLengthBytes} + key.size() + valueSize;
    if (size > std::numeric_limits<std::size_t>::max()) return Block();
    Block block = newBlock(static_cast<std::size_t>(size));
    if (!block) return block;
    char* const atValue = withLength(copied(withLength(block.get(), key.size()), key), valueSize);
    copied(atValue, valueBegin);
    return block;
}

}  // namespace korvex
