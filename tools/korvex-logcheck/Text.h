#pragma once

#include <string>
#include <string_view>
#include <vector>

// Configured text for a terminal: control characters as \xHH, the rest as it stands.
std::string printable(std::string_view text);

// The same, in quotes where one could not see its ends: when it is empty or a blank is at one.
std::string visible(std::string_view text);

// "TEXT", printable.
std::string quoted(std::string_view text);

// The words of a category's value, cut where the library cuts them: at blanks, tabs and commas.
std::vector<std::string> wordsOf(std::string_view value);

// "a, b, c"; "" for none.
std::string listed(const std::vector<std::string>& items);
