#include "terminal/LongList.h"

#include <algorithm>
#include <cstdio>
#include <utility>

#include "terminal/ShownKey.h"
#include "text/Escape.h"

namespace {

// A longer key pushes its own value aside, not those of all the others.
constexpr std::size_t kWidestKey = 40;
constexpr std::size_t kNarrowestValue = 8;
constexpr std::size_t kBeforeKey = 12;

std::string beginningOf(const std::string& value, bool goesOn, std::size_t width) {
    const std::string shown = escaped(std::string_view(value).substr(0, width + 1));
    if (!goesOn && value.size() <= width && shown.size() <= width) return shown;
    return shown.substr(0, width - 3) + "...";
}

std::string line(const std::string& size, const std::string& key, std::size_t gap,
                 const std::string& value) {
    char start[kBeforeKey + 1];
    std::snprintf(start, sizeof start, "%10s  ", size.c_str());
    if (value.empty()) return start + key + '\n';
    return start + key + std::string(gap + 2, ' ') + value + '\n';
}

}  // namespace

void LongList::add(std::string key, std::uint64_t size, std::string_view beginning) {
    const std::size_t keyColumns = columnsTaken(key);
    _rows.push_back({std::move(key), keyColumns, size, std::string(beginning)});
}

std::string LongList::text() const {
    std::size_t keyWidth = 0;
    for (const Row& row : _rows)
        keyWidth = std::max(keyWidth, row.keyColumns);
    keyWidth = std::min(keyWidth, kWidestKey);
    const std::size_t before = kBeforeKey + keyWidth + 2;
    const std::size_t width = std::max(_columns, before + kNarrowestValue) - before;
    const auto gap = [keyWidth](std::size_t taken) { return keyWidth - std::min(keyWidth, taken); };
    std::string all = line("SIZE", "KEY", gap(3), "VALUE");
    for (const Row& row : _rows) {
        all += line(std::to_string(row.size), row.key, gap(row.keyColumns),
                    beginningOf(row.beginning, row.beginning.size() < row.size, width));
    }
    return all;
}
