#include "terminal/ProgressLine.h"

#include <algorithm>

namespace {

constexpr std::size_t kWidest = 40;
constexpr std::size_t kNarrowest = 5;
constexpr std::size_t kMark = 3;

// What surrounds the bar: " [", "] " and four characters behind it.
constexpr std::size_t kFrame = 8;

std::string filled(std::size_t width, const ProgressStep& step) {
    const double share = static_cast<double>(step.done) / static_cast<double>(step.total);
    const auto count = static_cast<std::size_t>(share * static_cast<double>(width));
    return std::string(count, '#') + std::string(width - count, '.');
}

// There and back, a column each tenth of a second.
std::string moving(std::size_t width, std::chrono::milliseconds elapsed) {
    const std::size_t way = width - kMark;
    const std::size_t at = static_cast<std::size_t>(elapsed.count() / 100) % (2 * way);
    std::string bar(width, '.');
    bar.replace(at <= way ? at : 2 * way - at, kMark, kMark, '#');
    return bar;
}

std::string paddedTo4(const std::string& text) {
    return std::string(4 - std::min<std::size_t>(4, text.size()), ' ') + text;
}

}  // namespace

std::string progressLine(const ProgressStep& step, std::chrono::milliseconds elapsed,
                         std::size_t columns) {
    ProgressStep sane = step;
    sane.done = std::min(step.done, step.total);
    std::string line = step.what;
    const std::size_t around = line.size() + kFrame;
    if (columns >= around + kNarrowest) {
        const std::size_t width = std::min(columns - around, kWidest);
        line += " [" + (step.total > 0 ? filled(width, sane) : moving(width, elapsed)) + "]";
    }
    if (step.total > 0) {
        // Not 100 * done, which may not fit.
        const double percent =
            100.0 * static_cast<double>(sane.done) / static_cast<double>(sane.total);
        line += " " + paddedTo4(std::to_string(static_cast<unsigned>(percent)) + "%");
    }
    return line.substr(0, columns);
}
