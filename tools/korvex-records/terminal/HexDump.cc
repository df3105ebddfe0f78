#include "terminal/HexDump.h"

#include <algorithm>
#include <cstdio>

#include "text/Escape.h"
#include "text/Utf8.h"

namespace {

constexpr std::size_t kBytesALine = 16;

unsigned at(std::string_view bytes, std::size_t i) {
    return static_cast<unsigned char>(bytes[i]);
}

bool isPrintableAscii(unsigned c) {
    return c >= ' ' && c <= '~';
}

// A control character could move the cursor or program the keyboard.
bool isShownAsText(char32_t c) {
    return c == '\t' || c == '\n' || !isControl(c);
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
    char32_t character = 0;
    while (!bytes.empty()) {
        const std::size_t length = utf8Character(bytes, character);
        if (length == 0 || !isShownAsText(character)) return false;
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
