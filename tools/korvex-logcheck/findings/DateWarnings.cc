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

// Months where minutes are meant, or the other way, and what is meant.
constexpr std::pair<std::string_view, std::string_view> kSwapped[] = {
    {"%H:%m", "%H:%M"},       {"%I:%m", "%I:%M"},       {"%k:%m", "%k:%M"},
    {"%H.%m", "%H.%M"},       {"%H-%m", "%H-%M"},       {"%H%m", "%H%M"},
    {"%Y-%M", "%Y-%m"},       {"%Y/%M", "%Y/%m"},       {"%Y.%M", "%Y.%m"},
    {"%Y%M%d", "%Y%m%d"},     {"%y-%M-%d", "%y-%m-%d"}, {"%y%M%d", "%y%m%d"},
    {"%d.%M.%Y", "%d.%m.%Y"}, {"%d/%M/%Y", "%d/%m/%Y"}, {"%d-%M-%Y", "%d-%m-%Y"},
    {"%d.%M.%y", "%d.%m.%y"}, {"%d/%M/%y", "%d/%m/%y"}, {"%d-%M-%y", "%d-%m-%y"},
    {"%M/%d/%Y", "%m/%d/%Y"}, {"%M/%d/%y", "%m/%d/%y"},
};

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
        for (const auto& [wrong, meant] : kSwapped)
            checkMinutes(wrong, std::string(meant));
        for (std::size_t pos = 0; pos < _text.size();)
            pos = _text[pos] == '%' ? checkConversion(pos) : checkLiteral(pos);
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

    // What was left of the Java form among the conversions. Gives where the run of letters ends.
    std::size_t checkLiteral(std::size_t begin) {
        if (_text[begin] == '\'') return checkJavaQuotes(begin);
        std::size_t end = begin;
        while (end < _text.size() && isLetter(_text[end]))
            ++end;
        if (end == begin) return begin + 1;
        const std::string_view run = _text.substr(begin, end - begin);
        if (begin == _conversionEnd && isRepeated(_text[begin - 1], run)) {
            tellRepeated(begin, end);
        } else if (hasJavaFieldsOnly(run)) {
            tellJava(begin, end, javaDate(run).pattern);
        } else if (isBareLetter(begin, end)) {
            tell(_to, Code::DATE_TEXT, _argument.part(begin, 1).place(),
                 quoted(run) + " is no conversion: each line shows it as it stands",
                 '%' + std::string(run));
        }
        return end;
    }

    // "%Y-m-%d": a letter for itself between the signs of a date or a time.
    bool isBareLetter(std::size_t begin, std::size_t end) const {
        constexpr std::string_view signs = "-:/.,";
        const auto isSign = [&](std::size_t at) { return signs.find(_text[at]) != signs.npos; };
        const bool before = begin > 0 && isSign(begin - 1);
        const bool after = end < _text.size() && isSign(end);
        const bool first = begin == 0 && after;
        const bool last = before && (end == _text.size() || _text[end] == ' ');
        return end - begin == 1 && std::string_view("YmdHMSly").find(_text[begin]) != signs.npos &&
               ((before && after) || first || last);
    }

    // "%HH"; but seconds of the epoch may have their unit behind them.
    static bool isRepeated(char letter, std::string_view run) {
        return letter != 's' && run.find_first_not_of(letter) == run.npos;
    }

    void tellRepeated(std::size_t begin, std::size_t end) {
        const std::string_view run = _text.substr(begin - 1, end - begin + 1);
        const bool sure = run == "HH" || run == "dd" || run == "SS" || run == "YYYY" || run == "yy";
        const Piece conversion = _argument.part(begin - 2, end - begin + 2);
        const std::string meant = std::string(1, '%') + run.front();
        tell(_to, Code::DATE_JAVA, conversion.place(),
             quoted(conversion.text()) + " is " + meant + " and the text " + quoted(run.substr(1)),
             sure ? meant : "",
             sure ? _argument.part(begin, end - begin).replacedBy("") : std::vector<Edit>());
    }

    // "'T'": letters between apostrophes.
    std::size_t checkJavaQuotes(std::size_t begin) {
        std::size_t end = begin + 1;
        while (end < _text.size() && isLetter(_text[end]))
            ++end;
        if (end == begin + 1 || end == _text.size() || _text[end] != '\'') return begin + 1;
        tellJava(begin, end + 1, std::string(_text.substr(begin + 1, end - begin - 1)));
        return end + 1;
    }

    void tellJava(std::size_t begin, std::size_t end, const std::string& meant) {
        const Piece piece = _argument.part(begin, end - begin);
        tell(_to, Code::DATE_JAVA, piece.place(),
             quoted(piece.text()) +
                 " is printed as it stands: dates are written as strftime has them",
             meant, meant.empty() ? std::vector<Edit>() : piece.replacedBy(meant));
    }

    void checkMinutes(std::string_view wrong, const std::string& meant) {
        const char* const shown = wrong.find("%M") == wrong.npos ? "the month" : "minutes";
        const std::size_t pos = _text.find(wrong);
        if (pos == _text.npos || (pos > 0 && _text[pos - 1] == '%')) return;
        // "%Y-%MM" is told by its letters.
        const std::size_t end = pos + wrong.size();
        if (end < _text.size() && _text[end] == wrong.back()) return;
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
        _conversionEnd = pos == begin + 1 ? pos + 1 : _text.npos;
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
    std::size_t _conversionEnd = std::string_view::npos;  // of the last one without a flag
};

}  // namespace

void findInDate(const Piece& argument, Findings& to) {
    DateCheck(argument, to).run();
}
