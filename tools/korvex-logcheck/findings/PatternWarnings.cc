#include <algorithm>
#include <utility>

#include "PatternText.h"
#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"
#include "findings/PatternEnd.h"

namespace {

// What other logging libraries spell out; of an empty one there is nothing here.
constexpr std::pair<std::string_view, std::string_view> kWords[] = {
    {"message", "m"},     {"msg", "m"},        {"newline", "n"},   {"category", "c"},
    {"logger", "c"},      {"channel", "c"},    {"name", "c"},      {"level", "p"},
    {"loglevel", "p"},    {"priority", "p"},   {"severity", "p"},  {"thread", "t"},
    {"threadname", "t"},  {"threadid", "t"},   {"tid", "t"},       {"date", "d"},
    {"datetime", "d"},    {"time", "d"},       {"timestamp", "d"}, {"relative", "r"},
    {"class", ""},        {"method", ""},      {"file", ""},       {"line", ""},
    {"location", ""},     {"process", ""},     {"processid", ""},  {"pid", ""},
    {"throwable", ""},    {"exception", ""},   {"ex", ""},         {"nopex", ""},
    {"nopexception", ""}, {"mdc", ""},         {"ndc", ""},        {"marker", ""},
    {"caller", ""},       {"contextname", ""}, {"uuid", ""},       {"host", ""},
    {"hostname", ""},     {"user", ""},        {"username", ""},   {"clr", ""},
    {"highlight", ""},    {"style", ""},
};

// Unknown ones that make a date within the braces of %d.
constexpr std::string_view kDateLetters = "YyHIMSBbjTZ";

// What unknown letters print elsewhere.
const char* hintFor(char letter) {
    switch (letter) {
        case 'F':
        case 'L':
        case 'M':
            return "; a message does not know its file, line or method";
        case 'l':
            return "; a message does not know its file, line or method, and milliseconds are %l "
                   "within the braces of %d only";
        case 'x':
        case 'X':
            return "; there is no diagnostic context";
        default:
            return "";
    }
}

// A letter in the wrong case, where it means nothing else in other libraries.
std::string meantLetter(char letter) {
    if (letter == 'C') return "c";
    const std::string low = lowered(std::string(1, letter));
    return std::string("NPTD").find(letter) == std::string::npos ? "" : low;
}

class PatternCheck {
  public:
    PatternCheck(const Piece& value, Findings& to)
        : _value(value), _pattern(value.text()), _to(to) {}

    // Of one that is not whole, what it lacks is not told.
    void run(bool whole) {
        if (_pattern.empty()) return tellEmpty();
        if (checkQuotes()) return;
        const std::vector<PatternPart> parts = partsOf(_pattern);
        const bool message = std::any_of(parts.begin(), parts.end(), isMessage);
        checkDate(parts);
        for (std::size_t i = 0; i < parts.size(); ++i) {
            checkPart(parts[i], i + 1 < parts.size() ? &parts[i + 1] : nullptr, message);
        }
        const bool cut = !parts.empty() && parts.back().brace != PatternPart::kNone &&
                         parts.back().kind == PatternPart::CUT;
        if (whole && !message && !cut && !_messageTold) {
            tell(_to, Code::PATTERN_NO_MESSAGE, _value.place(),
                 "without %m no line shows its message");
        }
    }

  private:
    static bool isMessage(const PatternPart& part) {
        return part.letter == 'm' && part.kind == PatternPart::CONVERSION && !part.isZeroWide;
    }

    void tellEmpty() {
        tell(_to, Code::PATTERN_NO_MESSAGE, _value.place(),
             "the pattern is empty: nothing is written");
    }

    bool checkQuotes() {
        const std::string_view around = withoutQuotes(_pattern);
        const bool lone = around == _pattern;
        const std::string bare(lone ? withoutLoneQuote(_pattern) : around);
        if (bare == _pattern) return false;
        tell(_to, Code::PATTERN_QUOTED, _value.place(),
             std::string(lone ? "the quotation mark is" : "the quotation marks are") +
                 " printed with each line",
             bare, _value.replacedBy(bare));
        return true;
    }

    Piece piece(const PatternPart& part) const {
        return _value.part(part.begin, part.end - part.begin);
    }

    void checkPart(const PatternPart& part, const PatternPart* next, bool message) {
        if (part.kind == PatternPart::TEXT) return checkBackslashes(part);
        if (part.kind == PatternPart::CUT) {
            const bool brace = part.brace != PatternPart::kNone;
            return tell(_to, Code::PATTERN_CUT, piece(part).place(),
                        "the pattern ends within " + quoted(part.in(_pattern)) +
                            ", which prints nothing" + (brace ? ": there is no \"}\"" : ""),
                        brace ? std::string(part.in(_pattern)) + '}' : "");
        }
        if (part.kind != PatternPart::CONVERSION || checkWord(part)) return;
        if (next != nullptr) checkSecondArgument(part, *next);
        if (part.letter == ' ' && next != nullptr && isBlankBefore(*next)) {
            tellBlank(part);
        } else if (kConversionLetters.find(part.letter) == kConversionLetters.npos) {
            if (!isOfDate(part)) checkUnknown(part, message);
        } else if (part.brace == PatternPart::kNone) {
            return;
        } else if (part.letter == 'd') {
            const std::size_t size = part.argument(_pattern).size();
            if (size > 0) findInDate(_value.part(part.brace + 1, size), _to);
        } else {
            const Piece argument = _value.part(part.brace, part.end - part.brace);
            tell(_to, Code::PATTERN_ARGUMENT, argument.place(),
                 quoted(argument.text()) + " has no effect after %" + part.letter +
                     ": only %d takes an argument; a width, as in %.20" + part.letter +
                     ", cuts the text",
                 std::string(_pattern.substr(part.begin, part.brace - part.begin)),
                 argument.replacedBy(""));
        }
    }

    // "%d{ISO8601}{UTC}": the second one is text.
    void checkSecondArgument(const PatternPart& part, const PatternPart& next) {
        const std::string_view text = next.in(_pattern);
        const std::size_t close = text.find('}');
        const bool second = part.brace != PatternPart::kNone && next.kind == PatternPart::TEXT &&
                            text.front() == '{' && close != text.npos;
        if (!second) return;
        const Piece argument = _value.part(next.begin, close + 1);
        tell(_to, Code::PATTERN_ARGUMENT, argument.place(),
             quoted(argument.text()) + " is printed as it stands: a conversion takes one argument" +
                 (part.letter == 'd' ? ", and dates are those of the local time" : ""),
             std::string(part.in(_pattern)), argument.replacedBy(""));
    }

    // "% m".
    bool isBlankBefore(const PatternPart& next) const {
        if (next.kind != PatternPart::TEXT) return false;
        const std::string_view text = next.in(_pattern);
        const bool word = text.size() > 1 && isLetter(text[1]);
        return !word && kConversionLetters.find(text.front()) != kConversionLetters.npos;
    }

    void tellBlank(const PatternPart& part) {
        const Piece conversion = piece(part);
        const char letter = _pattern[part.end];
        _messageTold = _messageTold || letter == 'm';
        tell(_to, Code::PATTERN_UNKNOWN, conversion.place(),
             "there is no conversion " + quoted(conversion.text()) +
                 ": it prints nothing, and the letter after it is text",
             std::string(conversion.text().substr(0, conversion.size() - 1)) + letter,
             conversion.part(conversion.size() - 1, 1).replacedBy(""));
    }

    // "%msg" and the like; false: it is none of them.
    bool checkWord(const PatternPart& part) {
        std::size_t end = part.letterAt;
        while (end < _pattern.size() && isLetter(_pattern[end]))
            ++end;
        const std::string_view word = _pattern.substr(part.letterAt, end - part.letterAt);
        if (word.size() < 2) return false;
        const std::string low = lowered(word);
        for (const auto& [name, letter] : kWords) {
            if (low != name) continue;
            _messageTold = _messageTold || letter == "m";
            const bool known = kConversionLetters.find(part.letter) != kConversionLetters.npos;
            const Piece whole = _value.part(part.letterAt, word.size());
            tell(_to, Code::PATTERN_WORD, piece(part).place(),
                 "%" + std::string(word) + " is " +
                     (known ? std::string("%") + part.letter : "nothing") + " and the text " +
                     quoted(word.substr(1)),
                 letter.empty() ? "" : '%' + std::string(letter),
                 letter.empty() ? std::vector<Edit>() : whole.replacedBy(std::string(letter)));
            return true;
        }
        return false;
    }

    // "%Y-%m-%d %H:%M" without the "%d{" and the "}" around it is told once.
    void checkDate(const std::vector<PatternPart>& parts) {
        const auto isAmong = [](const PatternPart& part, std::string_view letters) {
            return part.kind == PatternPart::CONVERSION &&
                   letters.find(part.letter) != letters.npos;
        };
        const auto count = std::count_if(parts.begin(), parts.end(), [&](const PatternPart& part) {
            return isAmong(part, kDateLetters);
        });
        const auto first = std::find_if(parts.begin(), parts.end(), [&](const PatternPart& part) {
            return isAmong(part, "YyHIS");
        });
        if (count < 2 || first == parts.end()) return;
        _date = true;
        tell(_to, Code::PATTERN_UNKNOWN, piece(*first).place(),
             "there is no conversion " + quoted(first->in(_pattern)) +
                 ": it prints nothing; what is a date's stands in %d{...}");
    }

    bool isOfDate(const PatternPart& part) const {
        return _date && kDateLetters.find(part.letter) != kDateLetters.npos;
    }

    // Without a message, "%M" is its capital letter and no method.
    void checkUnknown(const PatternPart& part, bool message) {
        const bool capital = part.letter == 'M' && !message;
        _messageTold = _messageTold || capital;
        const std::string meant = capital ? "m" : meantLetter(part.letter);
        const bool sure = !meant.empty() && part.letter != 'C';
        const Piece letter = _value.part(part.letterAt, 1);
        tell(_to, Code::PATTERN_UNKNOWN, piece(part).place(),
             "there is no conversion " + quoted(part.in(_pattern)) + ": it prints nothing" +
                 (capital ? "" : hintFor(part.letter)),
             meant.empty() ? "" : '%' + meant,
             sure ? letter.replacedBy(meant) : std::vector<Edit>());
    }

    // What a string of a programming language, or a shell, would turn into something else.
    void checkBackslashes(const PatternPart& part) {
        static constexpr std::pair<std::string_view, std::string_view> kEscapes[] = {
            {"\\r\\n", "%n"}, {"\\n", "%n"}, {"\\r", ""}, {"\\t", "\t"}};
        for (std::size_t pos = part.begin; pos < part.end;) {
            std::size_t step = 1;
            for (const auto& [escape, meant] : kEscapes) {
                if (_pattern.substr(pos, std::min(escape.size(), part.end - pos)) != escape)
                    continue;
                const Piece found = _value.part(pos, escape.size());
                const bool newline = meant == "%n";
                tell(_to, Code::PATTERN_BACKSLASH, found.place(),
                     std::string(escape) + " is printed as it stands" +
                         (newline ? "; a newline is %n" : ""),
                     std::string(newline ? meant : ""), found.replacedBy(std::string(meant)));
                step = escape.size();
                break;
            }
            pos += step;
        }
    }

    const Piece _value;
    const std::string_view _pattern;
    Findings& _to;
    bool _messageTold = false;
    bool _date = false;  // conversions of a date are told already
};

}  // namespace

void findInPatterns(const Reading& reading, Findings& to) {
    for (const Appender* const appender : reading.config.everyAppender()) {
        const ConfigStatement* const said = lastOf(*appender, "layout.ConversionPattern");
        if (said == nullptr) continue;
        const Piece value = valueOf(reading.source, *said);
        const std::size_t hash = hashInPattern(reading.source, *said);
        if (hash != Source::kNone) {
            tell(to, Code::PATTERN_HASH, reading.source.placeOf(hash),
                 "a comment begins at the \"#\", wherever it stands: the pattern ends before it");
        }
        PatternCheck(value, to).run(hash == Source::kNone &&
                                    !isCutByComment(reading.source, value.line()));
    }
}
