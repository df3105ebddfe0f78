#include "Text.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>

namespace {

bool isContinuation(char c) {
    return (static_cast<unsigned char>(c) & 0xC0U) == 0x80;
}

// The value of a character of that many bytes.
std::uint32_t decoded(std::string_view character) {
    static constexpr unsigned char kFirstBits[] = {0, 0x7F, 0x1F, 0x0F, 0x07};
    std::uint32_t value =
        static_cast<unsigned char>(character.front()) & kFirstBits[character.size()];
    for (const char c : character.substr(1))
        value = value << 6U | (static_cast<unsigned char>(c) & 0x3FU);
    return value;
}

// What a terminal obeys or does not show.
bool isHidden(std::uint32_t c) {
    return c < 0x20 || (c >= 0x7F && c <= 0xA0) || c == 0xAD || (c >= 0x200B && c <= 0x200F) ||
           (c >= 0x2028 && c <= 0x202F) || (c >= 0x2060 && c <= 0x206F) || c == 0xFEFF;
}

void addEscaped(std::string& to, std::string_view bytes) {
    for (const char c : bytes) {
        char buf[5];
        std::snprintf(buf, sizeof buf, "\\x%02x", static_cast<unsigned char>(c));
        to += buf;
    }
}

}  // namespace

std::size_t utf8Length(std::string_view text) {
    if (text.empty()) return 0;
    const auto first = static_cast<unsigned char>(text.front());
    const std::size_t length = first < 0x80                     ? 1
                               : first >= 0xC2 && first <= 0xDF ? 2
                               : first >= 0xE0 && first <= 0xEF ? 3
                               : first >= 0xF0 && first <= 0xF4 ? 4
                                                                : 0;
    if (length == 0 || text.size() < length) return 0;
    for (const char c : text.substr(1, length - 1)) {
        if (!isContinuation(c)) return 0;
    }
    const std::uint32_t value = decoded(text.substr(0, length));
    const bool overlong = (length == 3 && value < 0x800) || (length == 4 && value < 0x10000);
    const bool surrogate = value >= 0xD800 && value <= 0xDFFF;
    return overlong || surrogate || value > 0x10FFFF ? 0 : length;
}

std::string printable(std::string_view text) {
    std::string shown;
    while (!text.empty()) {
        const std::size_t length = utf8Length(text);
        const std::string_view character = text.substr(0, std::max<std::size_t>(length, 1));
        if (length == 0 || isHidden(decoded(character))) {
            addEscaped(shown, character);
        } else {
            shown += character;
        }
        text.remove_prefix(character.size());
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

std::string_view withoutQuotes(std::string_view text) {
    while (text.size() > 2 && (text.front() == '"' || text.front() == '\'') &&
           text.back() == text.front()) {
        text = text.substr(1, text.size() - 2);
    }
    return text;
}

std::string lowered(std::string_view text) {
    std::string low(text);
    for (char& c : low) {
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    return low;
}
