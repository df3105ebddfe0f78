#include "text/Escape.h"

#include <algorithm>

#include "text/Utf8.h"

namespace {

void appendHexOf(std::string& out, char c) {
    constexpr char digits[] = "0123456789abcdef";
    const auto byte = static_cast<unsigned char>(c);
    out += digits[byte >> 4];
    out += digits[byte & 15];
}

int valueOf(char digit) {
    if (digit >= '0' && digit <= '9') return digit - '0';
    if (digit >= 'a' && digit <= 'f') return digit - 'a' + 10;
    if (digit >= 'A' && digit <= 'F') return digit - 'A' + 10;
    return -1;
}

}  // namespace

std::string toHex(std::string_view bytes) {
    std::string out;
    out.reserve(bytes.size() * 2);
    appendHex(out, bytes);
    return out;
}

void appendHex(std::string& out, std::string_view bytes) {
    for (const char c : bytes)
        appendHexOf(out, c);
}

bool appendHexByte(std::string& out, char high, char low) {
    const int h = valueOf(high);
    const int l = valueOf(low);
    if (h < 0 || l < 0) return false;
    out += static_cast<char>(h * 16 + l);
    return true;
}

std::string escaped(std::string_view bytes) {
    std::string out;
    appendEscaped(out, bytes);
    return out;
}

void appendEscaped(std::string& out, std::string_view bytes, std::string_view backslash) {
    for (const char c : bytes) {
        if (c == '\\') {
            out += backslash;
        } else if (c >= ' ' && c <= '~') {
            out += c;
        } else {
            out += '\\';
            appendHexOf(out, c);
        }
    }
}

std::string withoutControls(std::string_view text) {
    std::string out;
    while (!text.empty()) {
        char32_t character = 0;
        const std::size_t length = std::max<std::size_t>(1, utf8Character(text, character));
        for (const char c : text.substr(0, length)) {
            if (!isControl(character)) {
                out += c;
            } else {
                out += '\\';
                appendHexOf(out, c);
            }
        }
        text.remove_prefix(length);
    }
    return out;
}

bool appendUnescaped(std::string& out, std::string_view text) {
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            out += text[i];
        } else if (i + 1 < text.size() && text[i + 1] == '\\') {
            out += text[++i];
        } else if (i + 2 < text.size() && appendHexByte(out, text[i + 1], text[i + 2])) {
            i += 2;
        } else {
            return false;
        }
    }
    return true;
}
