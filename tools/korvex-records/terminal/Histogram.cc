#include "terminal/Histogram.h"

#include <algorithm>
#include <cstdio>
#include <numeric>

namespace {

// 0 for 0, else one more than the power of two: 1, 2 to 3, 4 to 7, ...
std::size_t classOf(std::uint64_t size) {
    std::size_t index = 0;
    for (; size > 0; size >>= 1)
        ++index;
    return index;
}

std::string rangeOf(std::size_t index) {
    if (index < 2) return std::to_string(index);
    const std::uint64_t low = std::uint64_t{1} << (index - 1);
    return std::to_string(low) + ".." + std::to_string(2 * low - 1);
}

// What occurs has one mark at least.
std::size_t barLength(std::uint64_t count, std::uint64_t most, std::size_t width) {
    if (count == 0) return 0;
    const double share = static_cast<double>(count) / static_cast<double>(most);
    return std::max<std::size_t>(1, static_cast<std::size_t>(share * static_cast<double>(width)));
}

}  // namespace

Histogram::Histogram(std::vector<std::uint64_t> sizes) : _sorted(std::move(sizes)) {
    std::sort(_sorted.begin(), _sorted.end());
}

std::uint64_t Histogram::sum() const {
    return std::accumulate(_sorted.begin(), _sorted.end(), std::uint64_t{0});
}

std::uint64_t Histogram::smallest() const {
    return _sorted.empty() ? 0 : _sorted.front();
}

std::uint64_t Histogram::median() const {
    return _sorted.empty() ? 0 : _sorted[(_sorted.size() - 1) / 2];
}

std::uint64_t Histogram::largest() const {
    return _sorted.empty() ? 0 : _sorted.back();
}

std::string Histogram::bars(std::size_t width) const {
    std::vector<std::uint64_t> counts(classOf(largest()) + 1);
    for (const std::uint64_t size : _sorted)
        ++counts[classOf(size)];
    const std::uint64_t most = *std::max_element(counts.begin(), counts.end());
    std::string lines;
    for (std::size_t i = classOf(smallest()); i < counts.size(); ++i) {
        char start[64];
        std::snprintf(start, sizeof start, "%22s %10llu", rangeOf(i).c_str(),
                      static_cast<unsigned long long>(counts[i]));
        const std::size_t marks = barLength(counts[i], most, width);
        lines += start + (marks > 0 ? "  " + std::string(marks, '#') : "") + "\n";
    }
    return lines;
}
