#include "base/PlainFormat.h"

#include <charconv>
#include <cstring>

inline namespace korvex {

namespace {

// Each of these writes one conversion's text into [to, end) and returns its end, or null when it
// does not fit.

template <class Number>
char* putNumber(char* to, char* end, Number value) {
    const auto [last, error] = std::to_chars(to, end, value);
    return error == std::errc() ? last : nullptr;
}

char* putHex(char* to, char* end, unsigned value) {
    const auto [last, error] = std::to_chars(to, end, value, 16);
    return error == std::errc() ? last : nullptr;
}

char* putText(char* to, char* end, const char* text) {
    if (text == nullptr) text = "(null)";  // as glibc and musl have it
    const std::size_t size = strnlen(text, static_cast<std::size_t>(end - to) + 1);
    if (size > static_cast<std::size_t>(end - to)) return nullptr;
    std::memcpy(to, text, size);
    return to + size;
}

char* putCharacter(char* to, char* end, char c) {
    if (to == end) return nullptr;
    *to = c;
    return to + 1;
}

// Writes the conversion after the percent sign that `p` has just passed. Also null if it is not one
// of those that are supported here.
char* convert(char* to, char* end, const char*& p, va_list* ap) {
    switch (*p++) {
        case 'd':
        case 'i':
            return putNumber(to, end, va_arg(*ap, int));
        case 'u':
            return putNumber(to, end, va_arg(*ap, unsigned));
        case 'x':
            return putHex(to, end, va_arg(*ap, unsigned));
        case 's':
            return putText(to, end, va_arg(*ap, const char*));
        case 'c':
            return putCharacter(to, end, static_cast<char>(va_arg(*ap, int)));
        case '%':
            return putCharacter(to, end, '%');
        case 'l':
            switch (*p++) {
                case 'd':
                    return putNumber(to, end, va_arg(*ap, long));
                case 'u':
                    return putNumber(to, end, va_arg(*ap, unsigned long));
            }
    }
    return nullptr;
}

char* convertAll(char* to, char* end, const char* p, va_list* ap) {
    while (to != nullptr && *p != '\0') {
        if (*p == '%') {
            to = convert(to, end, ++p, ap);
        } else {
            to = putCharacter(to, end, *p++);
        }
    }
    return to;
}

}  // namespace

bool formatPlain(std::string& out, const char* fmt, va_list ap) {
    char text[255];
    va_list again;
    va_copy(again, ap);
    char* const end = convertAll(text, text + sizeof text, fmt, &again);
    va_end(again);
    if (end != nullptr) out.append(text, end);
    return end != nullptr;
}

}  // namespace korvex
