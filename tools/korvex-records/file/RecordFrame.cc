#include "file/RecordFrame.h"

#include <strings.h>

namespace {

std::string cutShort(const char* what, std::uint32_t size, std::uint64_t left) {
    return std::string(what) + " cut short: " + std::to_string(size) +
           (size == 1 ? " byte, " : " bytes, ") + std::to_string(left) + " left";
}

}  // namespace

std::string readFrame(FileWindow& file, std::uint64_t offset, RecordFrame& frame) {
    frame.begin = offset;
    if (file.size() - offset < 4) return "key length cut short";
    frame.keySize = file.numberAt(offset);
    const std::uint64_t behindLength = file.size() - frame.keyAt();
    if (behindLength < frame.keySize) return cutShort("key", frame.keySize, behindLength);
    if (behindLength - frame.keySize < 4) return "value length cut short";
    frame.valueSize = file.numberAt(frame.keyAt() + frame.keySize);
    const std::uint64_t left = file.size() - frame.valueAt();
    if (left < frame.valueSize) return cutShort("value", frame.valueSize, left);
    return "";
}

bool looksLikeVersionKey(std::string_view key) {
    return key.size() >= kVersionKey.size() &&
           strncasecmp(key.data(), kVersionKey.data(), kVersionKey.size()) == 0;
}

bool isRefusedKey(std::string_view key) {
    return looksLikeVersionKey(key) || key.find('\0') != key.npos;
}
