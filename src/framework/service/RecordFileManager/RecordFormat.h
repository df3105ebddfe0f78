#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

inline namespace korvex {

// file   := record*            the first one written is the version record
// record := keyLength:u32le key valueLength:u32le value

inline constexpr std::string_view VERSION_KEY = "_record-file-version";
inline constexpr std::string_view VERSION_STR = "2.0";

constexpr std::size_t kLengthBytes = 4;

// Lengths are little-endian on every host.
inline void putLength(unsigned char (&out)[kLengthBytes], std::uint32_t n) {
    for (std::size_t i = 0; i < kLengthBytes; ++i)
        out[i] = static_cast<unsigned char>(n >> (8 * i));
}

// Of the four bytes there.
inline std::uint32_t getLength(const void* in) {
    const auto* const byte = static_cast<const unsigned char*>(in);
    return std::uint32_t{byte[0]} | std::uint32_t{byte[1]} << 8 | std::uint32_t{byte[2]} << 16 |
           std::uint32_t{byte[3]} << 24;
}

constexpr char asciiLower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

// Whether a key that is read back is taken for the version: by its beginning, in upper or lower
// case. Not by strncasecmp(3), for which I and i are no pair in some locales.
constexpr bool isVersionKey(std::string_view key) {
    if (key.size() < VERSION_KEY.size()) return false;
    for (std::size_t i = 0; i < VERSION_KEY.size(); ++i) {
        if (asciiLower(key[i]) != VERSION_KEY[i]) return false;
    }
    return true;
}

}  // namespace korvex
