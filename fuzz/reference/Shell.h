#pragma once

#include <optional>
#include <string>

// Shell words once more, read and written by a table.
namespace reference {

std::string quoted(const std::string& text);

struct Split {
    std::string word;
    std::string rest;
};
// Nothing when there is no whole, non-empty word.
std::optional<Split> split(const std::string& text);

// Whether a POSIX shell, too, reads quoted(text) back as this one word.
bool isForAnyShell(const std::string& text);

// The word as a real shell reads it.
std::string readByShell(const std::string& word);

}  // namespace reference
