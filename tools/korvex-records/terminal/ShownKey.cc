#include "terminal/ShownKey.h"

#include <langinfo.h>
#include <locale.h>
#include <unistd.h>
#include <wchar.h>
#include <wctype.h>

#include "support/TerminalQuery.h"
#include "text/Escape.h"
#include "text/Utf8.h"

namespace {

// The user's, whose characters are UTF-8; null otherwise. The process's own locale stays as it is.
locale_t utf8Locale() {
    static const locale_t kLocale = [] {
        const locale_t users = newlocale(LC_CTYPE_MASK, "", nullptr);
        const bool isUtf8 =
            users != nullptr && std::string_view(nl_langinfo_l(CODESET, users)) == "UTF-8";
        if (isUtf8) return users;
        if (users != nullptr) freelocale(users);
        return locale_t();
    }();
    return kLocale;
}

// Marks that are not seen but change the order or the look of what is around them.
bool isInvisible(char32_t c) {
    static constexpr struct {
        char32_t first, last;
    } kRanges[] = {{0xAD, 0xAD},     {0x61C, 0x61C},    {0x180E, 0x180E}, {0x200B, 0x200F},
                   {0x2028, 0x202E}, {0x2060, 0x206F},  {0xFE00, 0xFE0F}, {0xFEFF, 0xFEFF},
                   {0xFFF0, 0xFFFB}, {0xE0000, 0xE0FFF}};
    for (const auto& range : kRanges)
        if (c >= range.first && c <= range.last) return true;
    return false;
}

bool isPrintable(char32_t c, locale_t locale) {
    return !isInvisible(c) && iswprint_l(static_cast<wint_t>(c), locale) != 0;
}

// Asked once, because there may be a million keys.
locale_t localeOf(int fd) {
    static const locale_t kOut = isTerminal(STDOUT_FILENO) ? utf8Locale() : nullptr;
    static const locale_t kErr = isTerminal(STDERR_FILENO) ? utf8Locale() : nullptr;
    return fd == STDOUT_FILENO ? kOut : kErr;
}

}  // namespace

std::string shownKey(std::string_view key, int fd) {
    const locale_t locale = localeOf(fd);
    if (locale == nullptr) return escaped(key);
    std::string shown;
    while (!key.empty()) {
        char32_t character = 0;
        const std::size_t length = utf8Character(key, character);
        const bool asItIs = length > 1 && isPrintable(character, locale);
        const std::string_view piece = key.substr(0, asItIs ? length : 1);
        if (asItIs) shown += piece;
        if (!asItIs) appendEscaped(shown, piece);
        key.remove_prefix(piece.size());
    }
    return shown;
}

std::size_t columnsTaken(std::string_view shown) {
    const locale_t locale = utf8Locale();
    const locale_t former = locale == nullptr ? nullptr : uselocale(locale);
    std::size_t columns = 0;
    while (!shown.empty()) {
        char32_t character = 0;
        const std::size_t length = utf8Character(shown, character);
        const int width = length > 1 ? wcwidth(static_cast<wchar_t>(character)) : 1;
        columns += width < 0 ? 1 : static_cast<std::size_t>(width);
        shown.remove_prefix(length == 0 ? 1 : length);
    }
    if (former != nullptr) uselocale(former);
    return columns;
}
