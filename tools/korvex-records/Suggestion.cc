#include "Suggestion.h"

#include <algorithm>

namespace {

// How many characters must be put in, left out, exchanged, or swapped with the next one.
std::size_t distance(const std::string& a, const std::string& b) {
    std::vector<std::vector<std::size_t>> rows(a.size() + 1,
                                               std::vector<std::size_t>(b.size() + 1));
    for (std::size_t i = 0; i <= a.size(); ++i) {
        for (std::size_t j = 0; j <= b.size(); ++j) {
            if (i == 0 || j == 0) {
                rows[i][j] = i + j;
                continue;
            }
            const bool same = a[i - 1] == b[j - 1];
            rows[i][j] = std::min(
                {rows[i - 1][j] + 1, rows[i][j - 1] + 1, rows[i - 1][j - 1] + (same ? 0 : 1)});
            const bool swapped = i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1];
            if (swapped) rows[i][j] = std::min(rows[i][j], rows[i - 2][j - 2] + 1);
        }
    }
    return rows[a.size()][b.size()];
}

}  // namespace

std::string didYouMean(const std::string& typed, const std::vector<std::string>& names) {
    if (typed.size() > 64) return "";
    const std::string* best = nullptr;
    std::size_t least = 3;
    for (const std::string& name : names) {
        const std::size_t far = distance(typed, name);
        if (far >= least || far + 1 >= name.size()) continue;
        least = far;
        best = &name;
    }
    return best == nullptr ? "" : "; did you mean " + *best + "?";
}
