#include "Escape.h"

namespace {

void appendHex(std::string& out, char c) {
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
    for (const char c : bytes)
        appendHex(out, c);
    return out;
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
    for (const char c : bytes) {
        if (c == '\\') {
            out += "\\\\";
        } else if (c >= ' ' && c <= '~') {
            out += c;
        } else {
            out += '\\';
            appendHex(out, c);
        }
    }
    return out;
}
