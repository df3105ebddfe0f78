#include "Fix.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <stdexcept>
#include <utility>

#include "Source.h"

namespace {

// Edits by where they begin; none meets another one.
using Edits = std::map<std::size_t, Edit>;

bool isFree(const Edits& edits, const Edit& edit) {
    const auto next = edits.lower_bound(edit.begin);
    if (next != edits.end() && (next->first == edit.begin || next->first < edit.end)) return false;
    return next == edits.begin() || std::prev(next)->second.end <= edit.begin;
}

}  // namespace

std::string applied(const std::string& bytes, const Findings& findings) {
    Edits edits;
    for (const Finding& finding : findings) {
        const bool free = std::all_of(finding.edits.begin(), finding.edits.end(),
                                      [&](const Edit& edit) { return isFree(edits, edit); });
        if (!free) continue;
        for (const Edit& edit : finding.edits)
            edits.emplace(edit.begin, edit);
    }
    std::string result;
    std::size_t pos = 0;
    for (const auto& [begin, edit] : edits) {
        result.append(bytes, pos, begin - pos).append(edit.replacement);
        pos = edit.end;
    }
    return result.append(bytes, pos, std::string::npos);
}

// What is mended may show the next slip: a level in lower case behind a key of another library.
// Each round leaves fewer of them.
std::string mended(std::string bytes, const Pathname& home) {
    constexpr int most = 100;
    for (int round = 0; round < most; ++round) {
        std::string next = applied(bytes, findAll(Source(bytes), {home, {}}));
        if (next == bytes) return bytes;
        bytes = std::move(next);
    }
    throw std::logic_error("what is mended does not come to rest");
}
