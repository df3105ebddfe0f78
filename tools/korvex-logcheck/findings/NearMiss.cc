#include "findings/NearMiss.h"

#include <algorithm>

#include "Text.h"

std::size_t distanceOf(std::string_view a, std::string_view b) {
    std::vector<std::size_t> before;
    std::vector<std::size_t> last(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j)
        last[j] = j;
    for (std::size_t i = 1; i <= a.size(); ++i) {
        std::vector<std::size_t> row(b.size() + 1, i);
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t changed = last[j - 1] + (a[i - 1] == b[j - 1] ? 0 : 1);
            row[j] = std::min({changed, last[j] + 1, row[j - 1] + 1});
            const bool swapped = i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1];
            if (swapped) row[j] = std::min(row[j], before[j - 2] + 1);
        }
        before = std::move(last);
        last = std::move(row);
    }
    return last.back();
}

std::string nearestTo(std::string_view word, const std::vector<std::string>& candidates) {
    constexpr std::size_t longest = 64;  // beyond, it is no slip of the pen, and slow to compare
    if (word.size() > longest) return "";
    std::string nearest;
    std::size_t least = std::min<std::size_t>(2, (word.size() + 1) / 3) + 1;
    for (const std::string& candidate : candidates) {
        if (candidate.size() > longest || candidate == word) continue;
        const std::size_t distance = distanceOf(lowered(word), lowered(candidate));
        if (distance >= least) continue;
        least = distance;
        nearest = candidate;
    }
    return nearest;
}
