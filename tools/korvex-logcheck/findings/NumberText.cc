#include "findings/NumberText.h"

#include <cstdint>
#include <limits>
#include <optional>
#include <utility>

#include "Text.h"

namespace {

// How many bytes a unit is; 0 for what is none.
std::uint64_t bytesOf(std::string_view unit) {
    static constexpr std::pair<std::string_view, unsigned> kUnits[] = {
        {"", 0},        {"b", 0},         {"byte", 0},       {"bytes", 0},      {"k", 10},
        {"kb", 10},     {"kib", 10},      {"m", 20},         {"mb", 20},        {"mib", 20},
        {"g", 30},      {"gb", 30},       {"gib", 30},       {"t", 40},         {"tb", 40},
        {"tib", 40},    {"kbyte", 10},    {"kbytes", 10},    {"kilobyte", 10},  {"kilobytes", 10},
        {"mbyte", 20},  {"mbytes", 20},   {"megabyte", 20},  {"megabytes", 20}, {"gbyte", 30},
        {"gbytes", 30}, {"gigabyte", 30}, {"gigabytes", 30},
    };
    const std::string low = lowered(unit);
    for (const auto& [name, shift] : kUnits) {
        if (low == name) return std::uint64_t{1} << shift;
    }
    return 0;
}

// Takes the digits off, and the signs between each three of them.
std::string takeDigits(std::string_view& text) {
    std::string digits;
    char sign = '\0';
    while (!text.empty()) {
        if (isDigit(text.front())) {
            digits += text.front();
            text.remove_prefix(1);
            continue;
        }
        const char c = text.front();
        const bool separates = (c == ',' || c == '_' || c == '\'') && (sign == '\0' || sign == c);
        if (!separates || digits.empty() || text.size() < 4 || !isDigit(text[1]) ||
            !isDigit(text[2]) || !isDigit(text[3]) || (text.size() > 4 && isDigit(text[4]))) {
            break;
        }
        sign = c;
        text.remove_prefix(1);
    }
    return digits;
}

std::optional<std::uint64_t> times(const std::string& digits, std::uint64_t unit) {
    constexpr std::uint64_t most = std::numeric_limits<std::int64_t>::max();
    std::uint64_t n = 0;
    for (const char c : digits) {
        const auto digit = static_cast<std::uint64_t>(c - '0');
        if (n > (most - digit) / 10) return {};
        n = n * 10 + digit;
    }
    if (n > most / unit) return {};
    return n * unit;
}

}  // namespace

MeantNumber meantNumber(std::string_view text) {
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t' || text.back() == '#'))
        text.remove_suffix(1);
    text = withoutQuotes(text);
    if (beginsWith(text, "+")) text.remove_prefix(1);
    const std::string digits = takeDigits(text);
    while (!text.empty() && text.front() == ' ')
        text.remove_prefix(1);
    const std::uint64_t unit = bytesOf(text);
    if (digits.empty() || unit == 0) return {"", !text.empty()};
    const auto value = times(digits, unit);
    return {value ? std::to_string(*value) : "", !text.empty()};
}
