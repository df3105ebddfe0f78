#include "Text.h"

#include <algorithm>
#include <cstdio>

std::string printable(std::string_view text) {
    std::string shown;
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte >= 0x20 && byte != 0x7F) {
            shown += c;
            continue;
        }
        char buf[5];
        std::snprintf(buf, sizeof buf, "\\x%02x", byte);
        shown += buf;
    }
    return shown;
}

std::string visible(std::string_view text) {
    const auto isBlank = [](char c) { return c == ' ' || c == '\t'; };
    const bool clear = !text.empty() && !isBlank(text.front()) && !isBlank(text.back());
    return clear ? printable(text) : quoted(text);
}

std::string quoted(std::string_view text) {
    return '"' + printable(text) + '"';
}

std::vector<std::string> wordsOf(std::string_view value) {
    constexpr std::string_view separators = " \t,";
    std::vector<std::string> words;
    std::size_t pos = value.find_first_not_of(separators);
    while (pos != value.npos) {
        const std::size_t end = std::min(value.find_first_of(separators, pos), value.size());
        words.emplace_back(value.substr(pos, end - pos));
        pos = value.find_first_not_of(separators, end);
    }
    return words;
}

std::string listed(const std::vector<std::string>& items) {
    std::string all;
    for (const std::string& item : items)
        all += (all.empty() ? "" : ", ") + item;
    return all;
}
