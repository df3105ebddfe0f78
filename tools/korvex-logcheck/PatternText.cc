#include "PatternText.h"

#include <algorithm>

#include "Text.h"

namespace {

std::size_t skipDigits(std::string_view pattern, std::size_t pos) {
    while (pos < pattern.size() && isDigit(pattern[pos]))
        ++pos;
    return pos;
}

bool isZeroPrecision(std::string_view digits) {
    return !digits.empty() && digits.find_first_not_of('0') == digits.npos;
}

PatternPart conversionAt(std::string_view pattern, std::size_t begin) {
    PatternPart part{PatternPart::CUT, begin, pattern.size()};
    std::size_t pos = begin + 1;
    if (pos < pattern.size() && (pattern[pos] == '-' || pattern[pos] == '0')) ++pos;
    pos = skipDigits(pattern, pos);
    if (pos < pattern.size() && pattern[pos] == '.') {
        const std::size_t digits = pos + 1;
        pos = skipDigits(pattern, digits);
        part.isZeroWide = isZeroPrecision(pattern.substr(digits, pos - digits));
    }
    part.letterAt = pos;
    if (pos == pattern.size()) return part;
    part.letter = pattern[pos++];
    if (pos < pattern.size() && pattern[pos] == '{') {
        part.brace = pos;
        const std::size_t close = pattern.find('}', pos);
        if (close == pattern.npos) return part;
        pos = close + 1;
    }
    part.kind = PatternPart::CONVERSION;
    part.end = pos;
    return part;
}

}  // namespace

std::vector<PatternPart> partsOf(std::string_view pattern) {
    std::vector<PatternPart> parts;
    for (std::size_t pos = 0; pos < pattern.size(); pos = parts.back().end) {
        if (pattern[pos] != '%') {
            const std::size_t end = std::min(pattern.find('%', pos), pattern.size());
            parts.push_back({PatternPart::TEXT, pos, end});
        } else if (pattern.substr(pos, 2) == "%%") {
            parts.push_back({PatternPart::PERCENT, pos, pos + 2});
        } else {
            parts.push_back(conversionAt(pattern, pos));
        }
    }
    return parts;
}
