#include <algorithm>
#include <utility>

#include "Text.h"
#include "findings/Findings.h"
#include "findings/JavaDate.h"
#include "findings/NearMiss.h"

namespace {

// strftime's, and those that the GNU library has besides; %l is taken for the milliseconds.
constexpr std::string_view kKnown = "aAbBcCdDeFgGhHIjklmMnpPrRsStTuUVwWxXyYzZ%";
constexpr std::string_view kFlags = "_-0^#+";
// What elsewhere are fractions of a second.
constexpr std::string_view kFractions = "fLNqQ";

// The named layout that a text without conversions was meant for.
std::string namedLike(std::string_view text) {
    std::string letters;
    for (const char c : text) {
        if (isLetter(c) || isDigit(c)) letters += c;
    }
    for (const char* const name : {"ISO8601", "ABSOLUTE", "DATE"}) {
        if (lowered(letters) == lowered(name)) return name;
    }
    return nearestTo(letters, {"ISO8601", "ABSOLUTE", "DATE"});
}

class DateCheck {
  public:
    DateCheck(const Piece& argument, Findings& to)
        : _argument(argument), _text(argument.text()), _to(to) {}

    void run() {
        if (_text == "DATE" || _text == "ISO8601" || _text == "ABSOLUTE") return;
        if (_text.find('%') == _text.npos) return checkPlain();
        checkMinutes("%H:%m", "%H:%M", "the month");
        checkMinutes("%I:%m", "%I:%M", "the month");
        checkMinutes("%Y-%M", "%Y-%m", "minutes");
        checkMinutes("%d.%M.%Y", "%d.%m.%Y", "minutes");
        checkMinutes("%d/%M/%Y", "%d/%m/%Y", "minutes");
        checkMinutes("%M/%d/%Y", "%m/%d/%Y", "minutes");
        for (std::size_t pos = 0; (pos = _text.find('%', pos)) != _text.npos;)
            pos = checkConversion(pos);
    }

  private:
    // Without a conversion strftime copies the text.
    void checkPlain() {
        const std::string name = namedLike(_text);
        if (!name.empty()) {
            return tell(_to, Code::DATE_NAME, _argument.place(),
                        quoted(_text) +
                            " is no named layout, and is printed as it stands; they "
                            "are ISO8601, DATE and ABSOLUTE",
                        name, _argument.replacedBy(name));
        }
        const JavaDate java = javaDate(_text);
        if (java.isOne) {
            return tell(
                _to, Code::DATE_JAVA, _argument.place(),
                quoted(_text) +
                    " is printed as it stands: dates are written as "
                    "strftime has them",
                java.pattern,
                java.pattern.empty() ? std::vector<Edit>() : _argument.replacedBy(java.pattern));
        }
        tell(_to, Code::DATE_TEXT, _argument.place(),
             quoted(_text) + " has no conversion: each line shows it as it stands");
    }

    void checkMinutes(std::string_view wrong, const std::string& meant, const char* shown) {
        const std::size_t pos = _text.find(wrong);
        if (pos == _text.npos || (pos > 0 && _text[pos - 1] == '%')) return;
        const Piece piece = _argument.part(pos, wrong.size());
        tell(_to, Code::DATE_MINUTES, piece.place(), quoted(wrong) + " shows " + shown + " there",
             meant, piece.replacedBy(meant));
    }

    // Gives where the conversion ends.
    std::size_t checkConversion(std::size_t begin) {
        if (_text.substr(begin, 2) == "%l") return begin + 2;
        if (_text.substr(begin, 3) == "%%l") {
            tellAt(begin, 3, Code::DATE_MILLISECONDS,
                   "is a percent sign and the milliseconds: %l is looked for first");
            return begin + 3;
        }
        std::size_t pos = begin + 1;
        while (pos < _text.size() && kFlags.find(_text[pos]) != kFlags.npos)
            ++pos;
        while (pos < _text.size() && isDigit(_text[pos]))
            ++pos;
        if (pos < _text.size() && (_text[pos] == 'E' || _text[pos] == 'O')) ++pos;
        // What comes before a "%l" is a pattern of its own.
        const bool cut = pos == _text.size() || _text.substr(pos, 2) == "%l";
        if (cut) {
            tellAt(begin, pos - begin, Code::DATE_UNKNOWN,
                   "is cut short, and printed as it stands");
            return pos;
        }
        const char letter = _text[pos];
        if (kKnown.find(letter) == kKnown.npos) {
            tellUnknown(begin, pos + 1 - begin, letter);
        } else if (letter == 'l') {
            tellAt(begin, pos + 1 - begin, Code::DATE_MILLISECONDS,
                   "is the hour; only %l, without anything between, is the milliseconds");
        }
        return pos + 1;
    }

    void tellUnknown(std::size_t begin, std::size_t size, char letter) {
        const Piece piece = _argument.part(begin, size);
        const bool fraction = kFractions.find(letter) != kFractions.npos;
        tell(_to, Code::DATE_UNKNOWN, piece.place(),
             "strftime knows no " + quoted(piece.text()) +
                 (fraction ? "; the milliseconds are %l" : ""),
             fraction ? "%l" : "", fraction ? piece.replacedBy("%l") : std::vector<Edit>());
    }

    void tellAt(std::size_t begin, std::size_t size, Code code, const std::string& what) {
        const Piece piece = _argument.part(begin, size);
        tell(_to, code, piece.place(), quoted(piece.text()) + ' ' + what);
    }

    const Piece _argument;
    const std::string_view _text;
    Findings& _to;
};

}  // namespace

void findInDate(const Piece& argument, Findings& to) {
    DateCheck(argument, to).run();
}
