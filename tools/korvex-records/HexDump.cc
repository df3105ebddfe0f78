#include "HexDump.h"

#include <algorithm>
#include <cstdio>

#include "Escape.h"

namespace {

constexpr std::size_t kBytesALine = 16;

unsigned at(std::string_view bytes, std::size_t i) {
    return static_cast<unsigned char>(bytes[i]);
}

bool isPrintableAscii(unsigned c) {
    return c >= ' ' && c <= '~';
}

// The length of the printable character that begins here, in bytes; 0 when there is none. The
// limits keep out overlong forms, surrogates and the control characters U+0080 to U+009F.
std::size_t characterLength(std::string_view bytes) {
    static constexpr struct {
        unsigned firstLow, firstHigh, secondLow, secondHigh;
        std::size_t length;
    } kForms[] = {
        {0xC2, 0xC2, 0xA0, 0xBF, 2}, {0xC3, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
        {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3}, {0xEE, 0xEF, 0x80, 0xBF, 3},
        {0xF0, 0xF0, 0x90, 0xBF, 4}, {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4}};
    const unsigned first = at(bytes, 0);
    if (isPrintableAscii(first) || first == '\t' || first == '\n') return 1;
    for (const auto& form : kForms) {
        if (first < form.firstLow || first > form.firstHigh) continue;
        if (bytes.size() < form.length) return 0;
        if (at(bytes, 1) < form.secondLow || at(bytes, 1) > form.secondHigh) return 0;
        for (std::size_t i = 2; i < form.length; ++i) {
            if ((at(bytes, i) & 0xC0U) != 0x80U) return 0;
        }
        return form.length;
    }
    return 0;
}

std::string dumpedLine(std::size_t offset, std::string_view bytes) {
    char start[24];
    std::snprintf(start, sizeof start, "%08zx ", offset);
    std::string line = start;
    std::string characters;
    for (std::size_t i = 0; i < kBytesALine; ++i) {
        if (i % 8 == 0) line += ' ';
        if (i >= bytes.size()) {
            line += "   ";
            continue;
        }
        line += toHex(bytes.substr(i, 1)) + " ";
        characters += isPrintableAscii(at(bytes, i)) ? bytes[i] : '.';
    }
    return line + " |" + characters + "|\n";
}

}  // namespace

bool isText(std::string_view bytes) {
    while (!bytes.empty()) {
        const std::size_t length = characterLength(bytes);
        if (length == 0) return false;
        bytes.remove_prefix(length);
    }
    return true;
}

std::string hexDump(std::string_view bytes) {
    std::string lines;
    for (std::size_t offset = 0; offset < bytes.size(); offset += kBytesALine)
        lines += dumpedLine(offset, bytes.substr(offset, kBytesALine));
    return lines;
}
