#include "reference/RecordFile.h"

#include <strings.h>

#include <algorithm>
#include <cstdint>
#include <optional>

namespace reference {

namespace {

constexpr char kVersionKey[] = "_record-file-version";
constexpr std::uint32_t kHuge = 1 << 20;

class Reader {
  public:
    explicit Reader(const std::string& file) : _file(file) {}

    std::optional<std::uint32_t> length() {
        const std::string bytes = take(4);
        if (bytes.size() < 4) return std::nullopt;
        std::uint32_t n = 0;
        for (int i = 3; i >= 0; --i)
            n = n * 256 + static_cast<std::uint8_t>(bytes[static_cast<std::size_t>(i)]);
        return n;
    }
    // What is missing at the end is zero bytes.
    std::string text(std::uint32_t n) {
        std::string bytes = take(n);
        bytes.resize(n, '\0');
        return bytes;
    }
    // Somebody asked for more than there was.
    bool metTheEnd() const { return _metTheEnd; }

  private:
    std::string take(std::uint32_t n) {
        const std::string bytes = _file.substr(_at, n);
        _at += bytes.size();
        if (bytes.size() < n) _metTheEnd = true;
        return bytes;
    }

    const std::string& _file;
    std::size_t _at = 0;
    bool _metTheEnd = false;
};

}  // namespace

Loaded loadRecords(const std::string& file) {
    Loaded loaded;
    Reader reader(file);
    std::string version;
    for (;;) {
        if (reader.metTheEnd()) {
            loaded.unversioned = version.empty();
            return loaded;
        }
        const auto keyLength = reader.length();
        if (!keyLength) return loaded;
        if ((loaded.huge = *keyLength > kHuge)) return loaded;
        const std::string key = reader.text(*keyLength).c_str();
        const auto valueLength = reader.length();
        if (!valueLength) return loaded;
        if ((loaded.huge = *valueLength > kHuge)) return loaded;
        const std::string value = reader.text(*valueLength);
        if (strncasecmp(key.c_str(), kVersionKey, sizeof kVersionKey - 1) == 0) {
            version = value.c_str();
        } else {
            loaded.records[key] = value;
        }
    }
}

std::string saveRecords(const std::map<std::string, std::string>& records) {
    std::string file;
    const auto field = [&file](const std::string& bytes) {
        for (std::size_t n = bytes.size(), i = 0; i < 4; ++i, n /= 256)
            file += static_cast<char>(n % 256);
        file += bytes;
    };
    field(kVersionKey);
    field("2.0");
    for (const auto& [key, value] : records) {
        field(key);
        field(value);
    }
    return file;
}

}  // namespace reference
