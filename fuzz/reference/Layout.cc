#include "reference/Layout.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <ctime>
#include <vector>

namespace reference {

namespace {

bool skipOneOf(const std::string& text, std::size_t& at, const char* characters) {
    if (at == text.size() || std::strchr(characters, text[at]) == nullptr) return false;
    ++at;
    return true;
}

// Nothing but conversions to the text for the morning or the afternoon, which may be empty.
bool isOnlyAmPm(const std::string& piece) {
    for (std::size_t at = 0; at < piece.size();) {
        if (!skipOneOf(piece, at, "%")) return false;
        skipOneOf(piece, at, "_-^#");
        while (skipOneOf(piece, at, "0123456789")) {
        }
        skipOneOf(piece, at, "EO");
        if (!skipOneOf(piece, at, "p")) return false;
    }
    return true;
}

// What one date has to write its pieces into; it grows by doubling and stays grown.
class Buffer {
  public:
    std::optional<std::string> strftimeOf(const std::string& piece, const struct tm& local) {
        for (;;) {
            const std::size_t n =
                std::strftime(_bytes.data(), _bytes.size(), piece.c_str(), &local);
            if (n > 0) return std::string(_bytes.data(), n);
            if (isOnlyAmPm(piece)) return "";  // or too wide: nobody can tell
            if (_bytes.size() >= kFarTooLarge) return std::nullopt;
            _bytes.resize(2 * _bytes.size());
        }
    }

  private:
    static constexpr std::size_t kFarTooLarge = 1 << 20;

    std::vector<char> _bytes = std::vector<char>(64);
};

std::string threeDigits(int n) {
    std::string digits = std::to_string(n);
    while (digits.size() < 3)
        digits.insert(0, "0");
    return digits;
}

struct Conversion {
    char flag = ' ';
    unsigned long long minw = 0;
    std::optional<unsigned long long> maxw;
    char letter = '\0';
    std::optional<std::string> argument;
};

unsigned long long digitsAt(const std::string& pattern, std::size_t& at) {
    constexpr unsigned long long most = 0xFFFFFFFF;
    unsigned long long n = 0;
    for (; at < pattern.size() && std::isdigit(static_cast<unsigned char>(pattern[at])); ++at)
        n = std::min(most, n * 10 + static_cast<unsigned>(pattern[at] - '0'));
    return n;
}

// Reads what follows the "%"; false when the pattern ends inside it.
bool read(const std::string& pattern, std::size_t& at, Conversion& conversion) {
    if (at < pattern.size() && (pattern[at] == '-' || pattern[at] == '0')) {
        conversion.flag = pattern[at++];
    }
    conversion.minw = digitsAt(pattern, at);
    if (at < pattern.size() && pattern[at] == '.') {
        const std::size_t first = ++at;
        const unsigned long long n = digitsAt(pattern, at);
        if (at > first) conversion.maxw = n;
    }
    if (at == pattern.size()) return false;
    conversion.letter = pattern[at++];
    if (at < pattern.size() && pattern[at] == '{') {
        const std::size_t close = pattern.find('}', at);
        if (close == pattern.npos) return false;
        conversion.argument = pattern.substr(at + 1, close - at - 1);
        at = close + 1;
    }
    return true;
}

std::string fitted(const std::string& text, const Conversion& conversion) {
    if (conversion.maxw && *conversion.maxw < text.size()) {
        return text.substr(0, static_cast<std::size_t>(*conversion.maxw));
    }
    if (text.size() >= conversion.minw) return text;
    const auto missing = static_cast<std::size_t>(conversion.minw) - text.size();
    if (conversion.flag == '-') return text + std::string(missing, ' ');
    return std::string(missing, conversion.flag) + text;
}

}  // namespace

std::optional<std::string> date(const char* name, std::size_t length, int sec, int usec) {
    std::string pattern = name == nullptr ? "" : std::string(name, length);
    if (pattern.empty() || pattern == "ISO8601") pattern = "%Y-%m-%d %H:%M:%S,%l";
    if (pattern == "DATE") pattern = "%d %b %Y %H:%M:%S,%l";
    if (pattern == "ABSOLUTE") pattern = "%H:%M:%S,%l";
    const time_t seconds = sec;
    struct tm local {};
    localtime_r(&seconds, &local);
    std::string out;
    Buffer buffer;
    while (!pattern.empty()) {
        if (pattern.compare(0, 2, "%l") == 0) {
            out += threeDigits(usec / 1000);
            pattern.erase(0, 2);
            continue;
        }
        const std::size_t end = pattern.find("%l");
        const auto piece = buffer.strftimeOf(pattern.substr(0, end), local);
        if (!piece) return std::nullopt;
        out += *piece;
        pattern.erase(0, end);
    }
    return out;
}

std::optional<std::string> layOut(const std::string& pattern, const Line& line) {
    std::string out;
    for (std::size_t at = 0; at < pattern.size();) {
        if (pattern[at] != '%' || pattern.compare(at, 2, "%%") == 0) {
            out += pattern[at];
            at += pattern[at] == '%' ? 2 : 1;
            continue;
        }
        ++at;
        Conversion conversion;
        if (!read(pattern, at, conversion)) break;
        std::optional<std::string> text;
        switch (conversion.letter) {
            case 'm':
                text = line.message;
                break;
            case 'n':
                text = "\n";
                break;
            case 'c':
                text = line.channel;
                break;
            case 'p':
                text = line.level;
                break;
            case 't':
                text = line.thread;
                break;
            case 'r':
                text = std::to_string(line.epochMsec);
                break;
            case 'R':
                text = std::to_string(line.epochMsec / 1000);
                break;
            case 'd':
                text = conversion.argument ? date(conversion.argument->data(),
                                                  conversion.argument->size(), line.sec, line.usec)
                                           : date(nullptr, 0, line.sec, line.usec);
                if (!text) return std::nullopt;
                break;
            default:
                continue;
        }
        out += fitted(*text, conversion);
    }
    return out;
}

bool isReasonable(const std::string& pattern) {
    unsigned digits = 0;
    for (const char c : pattern) {
        const bool isDigit = std::isdigit(static_cast<unsigned char>(c)) != 0;
        digits = isDigit && (digits > 0 || c != '0') ? digits + 1 : 0;
        if (digits > 3) return false;
    }
    return pattern.find('u') == pattern.npos;
}

}  // namespace reference
