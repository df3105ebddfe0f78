#include "Text.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <utility>

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

// What a terminal obeys or does not show, or shows as a blank.
bool isHidden(std::uint32_t c) {
    static constexpr std::pair<std::uint32_t, std::uint32_t> kRanges[] = {
        {0x00, 0x1F},     {0x7F, 0xA0},       {0xAD, 0xAD},     {0x61C, 0x61C},   {0x115F, 0x1160},
        {0x1680, 0x1680}, {0x180E, 0x180E},   {0x2000, 0x200F}, {0x2028, 0x202F}, {0x205F, 0x206F},
        {0x3000, 0x3000}, {0x3164, 0x3164},   {0xFE00, 0xFE0F}, {0xFEFF, 0xFEFF}, {0xFFA0, 0xFFA0},
        {0xFFF9, 0xFFFB}, {0xE0000, 0xE0FFF},
    };
    return std::any_of(std::begin(kRanges), std::end(kRanges),
                       [=](const auto& range) { return c >= range.first && c <= range.second; });
}

struct Quotes {
    std::string_view open;
    std::string_view close;
};

// Those of the keyboard, and those that word processors make of them.
constexpr Quotes kQuotes[] = {
    {"\"", "\""},
    {"'", "'"},
    {"\xE2\x80\x9C", "\xE2\x80\x9D"},  // of English
    {"\xE2\x80\x98", "\xE2\x80\x99"},
    {"\xE2\x80\x9E", "\xE2\x80\x9C"},  // of German
    {"\xC2\xAB", "\xC2\xBB"},          // of French
};

bool isAround(const Quotes& quotes, std::string_view text) {
    return text.size() > quotes.open.size() + quotes.close.size() &&
           beginsWith(text, quotes.open) && endsWith(text, quotes.close);
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
    for (;;) {
        const auto* const quotes =
            std::find_if(std::begin(kQuotes), std::end(kQuotes),
                         [=](const Quotes& each) { return isAround(each, text); });
        if (quotes == std::end(kQuotes)) return text;
        text.remove_prefix(quotes->open.size());
        text.remove_suffix(quotes->close.size());
    }
}

std::string_view withoutLoneQuote(std::string_view text) {
    for (const Quotes& quotes : kQuotes) {
        for (const std::string_view quote : {quotes.open, quotes.close}) {
            if (text.size() <= quote.size() || text.find(quote) != text.rfind(quote)) continue;
            if (beginsWith(text, quote)) return text.substr(quote.size());
            if (endsWith(text, quote)) return text.substr(0, text.size() - quote.size());
        }
    }
    return text;
}

std::string shortened(std::string_view text) {
    constexpr std::size_t most = 500;
    if (text.size() <= most) return std::string(text);
    std::size_t size = most;
    // Not within a character.
    while (size > most - 3 && isContinuation(text[size]))
        --size;
    return std::string(text.substr(0, size)) + "...";
}

std::string lowered(std::string_view text) {
    std::string low(text);
    for (char& c : low) {
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    return low;
}
