#include "text/Base64.h"

#include <cstdint>

namespace {

constexpr std::string_view kDigits =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

}  // namespace

std::string toBase64(std::string_view bytes) {
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (; !bytes.empty(); bytes.remove_prefix(bytes.size() < 3 ? bytes.size() : 3)) {
        std::uint32_t group = 0;
        for (std::size_t i = 0; i < 3; ++i)
            group = group << 8 | (i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0U);
        for (std::size_t i = 0; i < 4; ++i)
            text += i <= bytes.size() ? kDigits[group >> (18 - 6 * i) & 0x3F] : '=';
    }
    return text;
}

bool appendBase64(std::string& out, std::string_view text) {
    const std::size_t start = out.size();
    if (text.size() % 4 != 0) return false;
    for (std::size_t at = 0; at < text.size(); at += 4) {
        std::uint32_t group = 0;
        std::size_t digits = 0;
        for (; digits < 4; ++digits) {
            const std::size_t value = kDigits.find(text[at + digits]);
            if (value == kDigits.npos) break;
            group |= static_cast<std::uint32_t>(value) << (18 - 6 * digits);
        }
        for (std::size_t i = 0; i + 1 < digits; ++i)
            out += static_cast<char>(group >> (16 - 8 * i) & 0xFF);
    }
    return toBase64(std::string_view(out).substr(start)) == text;
}
