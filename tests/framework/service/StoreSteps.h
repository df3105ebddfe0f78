#pragma once

#include <korvex/framework/service/RecordFileManager.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

// What tests do with the process's store and its file.
namespace storesteps {

inline std::string u32(std::size_t n) {
    std::string bytes;
    for (int i = 0; i < 4; ++i)
        bytes += static_cast<char>((n >> (8 * i)) & 255);
    return bytes;
}
inline std::string field(const std::string& s) {
    return u32(s.size()) + s;
}
inline std::string record(const std::string& key, const std::string& value) {
    return field(key) + field(value);
}
inline const std::string kVersionRecord(
    "\x14\0\0\0_record-file-version\x03\0\0\0"
    "2.0",
    31);

inline RecordFileManager& store() {
    return *RecordFileManager::instance();
}

inline void put(const std::string& key, const std::string& value, bool save = false) {
    PersistentHashData data;
    data._pData = const_cast<char*>(value.data());
    data._size = static_cast<std::uint32_t>(value.size());
    store().put(key, data, save);
}

inline std::string get(const std::string& key) {
    PersistentHashData data;
    store().get(key, data);
    if (data._pData == nullptr) return "(absent)";
    const std::unique_ptr<char[]> owner(static_cast<char*>(data._pData));
    return {owner.get(), data._size};
}

// "key=value" of every record with the prefix.
inline std::vector<std::string> all(const std::string& prefix = "") {
    std::vector<PersistentFullData> list;
    const bool matched = store().enumerate(prefix, list);
    std::vector<std::string> texts;
    for (const PersistentFullData& full : list) {
        const std::unique_ptr<char[]> key(static_cast<char*>(full._pKey));
        const std::unique_ptr<char[]> value(static_cast<char*>(full._pData));
        if (key[full._keySize] != '\0') texts.emplace_back("(no NUL)");
        texts.push_back(std::string(key.get(), full._keySize) + "=" +
                        std::string(value.get(), full._dataSize));
    }
    if (matched == texts.empty()) texts.emplace_back("(wrong result)");
    return texts;
}

}  // namespace storesteps
