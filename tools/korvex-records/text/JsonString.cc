#include "text/JsonString.h"

#include "text/Escape.h"
#include "text/Utf8.h"

namespace {

constexpr struct {
    char letter;
    char byte;
} kEscapes[] = {{'"', '"'},  {'\\', '\\'}, {'/', '/'},  {'b', '\b'},
                {'f', '\f'}, {'n', '\n'},  {'r', '\r'}, {'t', '\t'}};

// Four hex digits, which are taken away.
bool readUnit(std::string_view& rest, char32_t& unit) {
    std::string bytes;
    if (rest.size() < 4 || !appendHexByte(bytes, rest[0], rest[1]) ||
        !appendHexByte(bytes, rest[2], rest[3])) {
        return false;
    }
    rest.remove_prefix(4);
    unit = static_cast<unsigned char>(bytes[0]);
    unit = unit << 8U | static_cast<unsigned char>(bytes[1]);
    return true;
}

// What stands behind "\u".
const char* readCodePoint(std::string_view& rest, std::string& out) {
    char32_t first = 0;
    char32_t second = 0;
    if (!readUnit(rest, first)) return "\\u without four hex digits";
    if (first >= 0xD800 && first <= 0xDFFF) {
        const bool isPair = first < 0xDC00 && rest.substr(0, 2) == "\\u";
        if (isPair) rest.remove_prefix(2);
        if (!isPair || !readUnit(rest, second) || second < 0xDC00 || second > 0xDFFF) {
            return "half a surrogate pair";
        }
        first = 0x10000 + ((first - 0xD800) << 10U) + (second - 0xDC00);
    }
    appendUtf8(out, first);
    return nullptr;
}

// What stands behind a backslash.
const char* readEscape(std::string_view& rest, std::string& out) {
    if (rest.empty()) return "an open string";
    const char letter = rest[0];
    rest.remove_prefix(1);
    if (letter == 'u') return readCodePoint(rest, out);
    for (const auto& escape : kEscapes) {
        if (escape.letter != letter) continue;
        out += escape.byte;
        return nullptr;
    }
    return "an unknown escape";
}

}  // namespace

void appendJsonString(std::string& out, std::string_view text) {
    out += '"';
    while (!text.empty()) {
        char32_t character = 0;
        const std::size_t length = utf8Character(text, character);
        if (character == '"' || character == '\\') {
            out += '\\';
            out += text[0];
        } else if (character == '\n') {
            out += "\\n";
        } else if (character == '\t') {
            out += "\\t";
        } else if (isControl(character)) {
            const char last = static_cast<char>(character);
            out += "\\u00" + toHex({&last, 1});
        } else {
            out += text.substr(0, length);
        }
        text.remove_prefix(length);
    }
    out += '"';
}

const char* readJsonString(std::string_view& rest, std::string& out) {
    out.clear();
    if (rest.empty() || rest[0] != '"') return "no string";
    rest.remove_prefix(1);
    while (!rest.empty() && rest[0] != '"') {
        if (rest[0] == '\\') {
            rest.remove_prefix(1);
            const char* const wrong = readEscape(rest, out);
            if (wrong != nullptr) return wrong;
            continue;
        }
        char32_t character = 0;
        const std::size_t length = utf8Character(rest, character);
        if (length == 0) return "bytes that are not UTF-8";
        if (character < ' ') return "a control character in a string";
        out += rest.substr(0, length);
        rest.remove_prefix(length);
    }
    if (rest.empty()) return "an open string";
    rest.remove_prefix(1);
    return nullptr;
}
