#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

// Configured text for a terminal: as \xHH what a terminal obeys (control characters, those that
// turn the direction of writing) or hides (a byte order mark, a blank that is none), and what is no
// UTF-8; the rest as it stands.
std::string printable(std::string_view text);

// The length of the UTF-8 character that the text begins with; 0: it begins with none.
std::size_t utf8Length(std::string_view text);

// The same, in quotes where one could not see its ends: when it is empty or a blank is at one.
std::string visible(std::string_view text);

// "TEXT", printable.
std::string quoted(std::string_view text);

// The words of a category's value, cut where the library cuts them: at blanks, tabs and commas.
std::vector<std::string> wordsOf(std::string_view value);

// "a, b, c"; "" for none.
std::string listed(const std::vector<std::string>& items);

// Without the quotation marks around it, however many; itself when there are none, or nothing else.
std::string_view withoutQuotes(std::string_view text);

// Without a quotation mark that stands at its beginning or at its end and nowhere else.
std::string_view withoutLoneQuote(std::string_view text);

// Its first 500 bytes or so and "...", where it is longer: what is quoted is to be read.
std::string shortened(std::string_view text);

// In lower case, as far as ASCII goes.
std::string lowered(std::string_view text);

inline bool isDigit(char c) {
    return c >= '0' && c <= '9';
}
inline bool isLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
inline bool beginsWith(std::string_view text, std::string_view start) {
    return text.substr(0, start.size()) == start;
}
inline bool endsWith(std::string_view text, std::string_view end) {
    return text.size() >= end.size() && text.substr(text.size() - end.size()) == end;
}
