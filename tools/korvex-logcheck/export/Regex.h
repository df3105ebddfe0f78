#pragma once

#include <string>

#include "export/LineShape.h"

// How an engine writes regular expressions.
struct RegexStyle {
    const char* group;  // before a group's name: "(?<" or "(?P<"; null: there are no names
    // Whether what stands behind can be looked at. Without, the blanks that fill a level up are
    // within its group, to be trimmed, where what follows may begin with blanks itself.
    bool looksBehind;
    const char* timeName;  // the group of the time
};

inline constexpr RegexStyle kPerlStyle{"(?<", true, "time"};
inline constexpr RegexStyle kRe2Style{"(?P<", false, "time"};
inline constexpr RegexStyle kPosixStyle{nullptr, false, nullptr};  // extended, as in regcomp(3)

// What stands before the message, from "^" on; with groups where `named`.
std::string headRegex(const LineShape& shape, const RegexStyle& style, bool named);

// Whether the level's group holds blanks that are not the level's.
bool levelIsFilled(const LineShape& shape, const RegexStyle& style);

// The text as an expression that matches it and nothing else, in any style.
std::string escaped(const std::string& text, const RegexStyle& style);

// "A|B|C", escaped.
std::string anyOf(const std::vector<std::string>& words, const RegexStyle& style);
