#include "LongList.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

#include "Escape.h"

namespace {

// A longer key pushes its own value aside, not those of all the others.
constexpr std::size_t kWidestKey = 40;
constexpr std::size_t kNarrowestValue = 8;
constexpr std::size_t kBeforeKey = 12;

std::string beginningOf(const std::string& value, std::size_t width) {
    std::string shown = escaped(std::string_view(value).substr(0, width + 1));
    if (value.size() <= width && shown.size() <= width) return shown;
    return shown.substr(0, width - 3) + "...";
}

std::string line(const std::string& size, const std::string& key, std::size_t keyWidth,
                 const std::string& value) {
    char start[kBeforeKey + 1];
    std::snprintf(start, sizeof start, "%10s  ", size.c_str());
    if (value.empty()) return start + key + '\n';
    const std::size_t gap = keyWidth - std::min(keyWidth, key.size()) + 2;
    return start + key + std::string(gap, ' ') + value + '\n';
}

}  // namespace

std::string longList(const std::vector<RecordStore::Record>& records, std::size_t columns) {
    std::size_t keyWidth = 0;
    for (const auto& record : records)
        keyWidth = std::max(keyWidth, escaped(record.key).size());
    keyWidth = std::min(keyWidth, kWidestKey);
    const std::size_t before = kBeforeKey + keyWidth + 2;
    const std::size_t width = std::max(columns, before + kNarrowestValue) - before;
    std::string all = line("SIZE", "KEY", keyWidth, "VALUE");
    for (const auto& record : records) {
        all += line(std::to_string(record.value.size()), escaped(record.key), keyWidth,
                    beginningOf(record.value, width));
    }
    return all;
}
