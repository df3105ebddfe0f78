#include "findings/PatternEnd.h"

#include "PatternText.h"
#include "Text.h"

namespace {

bool hasMessage(const std::vector<PatternPart>& parts) {
    for (const PatternPart& part : parts) {
        if (part.kind == PatternPart::CONVERSION && part.letter == 'm') return true;
    }
    return false;
}

bool hasConversion(std::string_view pattern) {
    for (const PatternPart& part : partsOf(pattern)) {
        if (part.kind == PatternPart::CONVERSION &&
            kConversionLetters.find(part.letter) != kConversionLetters.npos)
            return true;
    }
    return false;
}

// Without the blanks and the "#" that may belong to it.
std::string_view trimmed(std::string_view pattern) {
    return pattern.substr(0, pattern.find_last_not_of(" \t#") + 1);
}

}  // namespace

std::size_t hashInPattern(const Source& source, const ConfigStatement& said) {
    const SourceLine& line = source.line(said.lineno);
    const std::string_view rest =
        std::string_view(source.bytes()).substr(line.at.back(), line.end - line.at.back());
    const std::size_t hash = rest.find('#');
    if (hash == rest.npos || !hasConversion(rest.substr(hash + 1))) return Source::kNone;
    const std::string_view pattern = trimmed(said.value);
    const std::vector<PatternPart> parts = partsOf(pattern);
    const bool whole = hasMessage(parts) && parts.back().kind == PatternPart::CONVERSION &&
                       parts.back().letter == 'n';
    return whole ? Source::kNone : line.at.back() + hash;
}

bool isCutByComment(const Source& source, const SourceLine& line) {
    const std::size_t comment = source.openComment();
    return comment != Source::kNone && comment >= line.begin && comment <= line.end;
}
