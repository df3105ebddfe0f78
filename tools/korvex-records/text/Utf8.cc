#include "text/Utf8.h"

namespace {

unsigned at(std::string_view bytes, std::size_t i) {
    return static_cast<unsigned char>(bytes[i]);
}

}  // namespace

std::size_t utf8Character(std::string_view bytes, char32_t& character) {
    // The limits of the second byte keep out overlong forms and surrogates.
    static constexpr struct {
        unsigned firstLow, firstHigh, secondLow, secondHigh;
        std::size_t length;
    } kForms[] = {{0xC2, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
                  {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3},
                  {0xEE, 0xEF, 0x80, 0xBF, 3}, {0xF0, 0xF0, 0x90, 0xBF, 4},
                  {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4}};
    if (bytes.empty()) return 0;
    const unsigned first = at(bytes, 0);
    character = first;
    if (first < 0x80) return 1;
    for (const auto& form : kForms) {
        if (first < form.firstLow || first > form.firstHigh) continue;
        if (bytes.size() < form.length) return 0;
        if (at(bytes, 1) < form.secondLow || at(bytes, 1) > form.secondHigh) return 0;
        character = first & (0x7FU >> form.length);
        for (std::size_t i = 1; i < form.length; ++i) {
            if ((at(bytes, i) & 0xC0U) != 0x80U) return 0;
            character = character << 6U | (at(bytes, i) & 0x3FU);
        }
        return form.length;
    }
    return 0;
}

bool isUtf8(std::string_view bytes) {
    char32_t ignored = 0;
    while (!bytes.empty()) {
        const std::size_t length = utf8Character(bytes, ignored);
        if (length == 0) return false;
        bytes.remove_prefix(length);
    }
    return true;
}

bool isControl(char32_t character) {
    return character < ' ' || (character >= 0x7F && character <= 0x9F);
}

void appendUtf8(std::string& out, char32_t character) {
    const auto piece = [&out, character](unsigned shift, unsigned mark, unsigned mask) {
        out += static_cast<char>(mark | (character >> shift & mask));
    };
    if (character < 0x80) {
        piece(0, 0, 0x7F);
        return;
    }
    if (character >= 0x10000) {
        piece(18, 0xF0, 0x07);
        piece(12, 0x80, 0x3F);
    } else if (character >= 0x800) {
        piece(12, 0xE0, 0x0F);
    }
    if (character >= 0x800) piece(6, 0x80, 0x3F);
    if (character < 0x800) piece(6, 0xC0, 0x1F);
    piece(0, 0x80, 0x3F);
}
