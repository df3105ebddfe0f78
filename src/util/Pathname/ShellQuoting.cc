#include <korvex/util/Pathname.h>

#include "base/Assert.h"

#include <algorithm>
#include <array>
#include <string_view>

inline namespace korvex {

namespace {

enum class CharClass : unsigned char {
    ORDINARY,
    BLANK,
    DOUBLE_QUOTE_SPECIAL,
    SPECIAL,
    SINGLE_QUOTE
};

constexpr std::array<CharClass, 256> classTable() {
    std::array<CharClass, 256> table{};
    for (const char c : std::string_view("\t\n ")) {
        table[static_cast<unsigned char>(c)] = CharClass::BLANK;
    }
    for (const char c : std::string_view("\"$\\")) {
        table[static_cast<unsigned char>(c)] = CharClass::DOUBLE_QUOTE_SPECIAL;
    }
    for (const char c : std::string_view("#&*;=?[]|")) {
        table[static_cast<unsigned char>(c)] = CharClass::SPECIAL;
    }
    table[static_cast<unsigned char>('\'')] = CharClass::SINGLE_QUOTE;
    return table;
}

CharClass classOf(char c) {
    static constexpr std::array<CharClass, 256> table = classTable();
    return table[static_cast<unsigned char>(c)];
}

bool has(const std::string& s, CharClass wanted) {
    return std::any_of(s.begin(), s.end(), [=](char c) { return classOf(c) == wanted; });
}

bool isBlank(char c) {
    return classOf(c) == CharClass::BLANK;
}

// Backslashes, and double quotes around it all where there is a blank, which they protect together
// with all but the double quote's own specials.
std::string escaped(const std::string& s) {
    const bool quoted = has(s, CharClass::BLANK);
    std::string word;
    if (quoted) word += '"';
    for (const char c : s) {
        const CharClass cls = classOf(c);
        const bool protectedByQuotes =
            quoted && (cls == CharClass::SPECIAL || cls == CharClass::SINGLE_QUOTE);
        if (cls != CharClass::ORDINARY && cls != CharClass::BLANK && !protectedByQuotes) {
            word += '\\';
        }
        word += c;
    }
    if (quoted) word += '"';
    return word;
}

// Reads one shell word, a character at a time.
class WordReader {
  public:
    // False when the character ends the word; it is not part of it then.
    bool take(char c) {
        if (_escape) {
            _word += c;
            _escape = false;
            return true;
        }
        switch (_state) {
            case DOUBLE_QUOTES:
                takeDoubleQuoted(c);
                return true;
            case SINGLE_QUOTES:
                takeSingleQuoted(c);
                return true;
            case BASE:
                break;
        }
        return takeBase(c);
    }
    bool complete() const { return _state == BASE && !_escape; }
    const std::string& word() const { return _word; }

  private:
    enum State { BASE, DOUBLE_QUOTES, SINGLE_QUOTES };

    bool takeBase(char c) {
        const State state = _state;
        KORVEX_ASSERT(state == BASE);
        if (isBlank(c)) return false;
        if (c == '\'') {
            _state = SINGLE_QUOTES;
        } else if (c == '"') {
            _state = DOUBLE_QUOTES;
        } else if (c == '\\') {
            _escape = true;
        } else {
            _word += c;
        }
        return true;
    }
    void takeDoubleQuoted(char c) {
        if (c == '"') {
            _state = BASE;
        } else if (c == '\\') {
            _escape = true;
        } else {
            _word += c;
        }
    }
    void takeSingleQuoted(char c) {
        if (c == '\'') {
            _state = BASE;
        } else {
            _word += c;
        }
    }

    State _state = BASE;
    bool _escape = false;
    std::string _word;
};

}  // namespace

std::string Pathname::shellQuoted() const {
    if (empty()) return "\"\"";
    if (std::all_of(begin(), end(), [](char c) { return classOf(c) == CharClass::ORDINARY; })) {
        return *this;
    }
    if (!has(*this, CharClass::SINGLE_QUOTE) && has(*this, CharClass::DOUBLE_QUOTE_SPECIAL)) {
        return "'" + *this + "'";
    }
    return escaped(*this);
}

bool Pathname::splitArgShellQuoted(const std::string& s, Pathname& arg, std::string& rest) {
    WordReader reader;
    auto p = std::find_if_not(s.begin(), s.end(), isBlank);
    while (p != s.end() && reader.take(*p))
        ++p;
    const bool found = reader.complete() && !reader.word().empty();
    std::string remainder(p, s.end());  // before the outputs change: s may be one of them
    arg = reader.word();
    if (found) rest = std::move(remainder);
    return found;
}

}  // namespace korvex
