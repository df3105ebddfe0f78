#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

// A piece of a pattern as the library's compiler reads it. Offsets are those of the pattern.
struct PatternPart {
    static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

    enum Kind {
        TEXT,
        PERCENT,     // "%%"
        CONVERSION,  // with its letter, and its argument if it has one
        CUT          // the pattern ends within it, so it prints nothing
    };
    Kind kind;
    std::size_t begin;
    std::size_t end;
    char letter = '\0';         // CONVERSION
    std::size_t letterAt = 0;   // CONVERSION, and CUT behind its letter
    std::size_t brace = kNone;  // where the argument's "{" stands
    bool isZeroWide = false;    // ".0": it prints nothing

    std::string_view in(std::string_view pattern) const {
        return pattern.substr(begin, end - begin);
    }
    // Without the braces.
    std::string_view argument(std::string_view pattern) const {
        return pattern.substr(brace + 1, end - brace - 2);
    }
};

std::vector<PatternPart> partsOf(std::string_view pattern);

// The letters that mean something.
constexpr std::string_view kConversionLetters = "mncptdrRu";
