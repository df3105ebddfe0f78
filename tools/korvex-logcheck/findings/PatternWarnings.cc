#include <algorithm>
#include <utility>

#include "PatternText.h"
#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"

namespace {

// What other logging libraries spell out; of an empty one there is nothing here.
constexpr std::pair<std::string_view, std::string_view> kWords[] = {
    {"message", "m"}, {"msg", "m"},      {"newline", "n"},  {"category", "c"}, {"logger", "c"},
    {"level", "p"},   {"priority", "p"}, {"thread", "t"},   {"date", "d"},     {"relative", "r"},
    {"class", ""},    {"method", ""},    {"file", ""},      {"line", ""},      {"location", ""},
    {"process", ""},  {"pid", ""},       {"throwable", ""}, {"exception", ""},
};

// What unknown letters print elsewhere.
const char* hintFor(char letter) {
    switch (letter) {
        case 'F':
        case 'L':
        case 'l':
        case 'M':
            return "; a message does not know its file, line or method";
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

    void run() {
        const std::string_view bare = withoutQuotes(_pattern);
        if (bare != _pattern) {
            return tell(_to, Code::PATTERN_QUOTED, _value.place(),
                        "the quotation marks are printed with each line", std::string(bare),
                        _value.replacedBy(std::string(bare)));
        }
        const std::vector<PatternPart> parts = partsOf(_pattern);
        for (const PatternPart& part : parts)
            checkPart(part);
        const bool message = std::any_of(parts.begin(), parts.end(), [](const PatternPart& part) {
            return part.letter == 'm' && part.kind == PatternPart::CONVERSION && !part.isZeroWide;
        });
        if (message) return;
        tell(_to, Code::PATTERN_NO_MESSAGE, _value.place(), "without %m no line shows its message",
             _pattern.find("%M") == _pattern.npos ? "" : "%m");
    }

  private:
    Piece piece(const PatternPart& part) const {
        return _value.part(part.begin, part.end - part.begin);
    }

    void checkPart(const PatternPart& part) {
        if (part.kind == PatternPart::TEXT) return checkBackslashes(part);
        if (part.kind == PatternPart::CUT) {
            const bool brace = part.brace != PatternPart::kNone;
            return tell(_to, Code::PATTERN_CUT, piece(part).place(),
                        "the pattern ends within " + quoted(part.in(_pattern)) +
                            ", which prints nothing" + (brace ? ": there is no \"}\"" : ""),
                        brace ? std::string(part.in(_pattern)) + '}' : "");
        }
        if (part.kind != PatternPart::CONVERSION || checkWord(part)) return;
        if (kConversionLetters.find(part.letter) == kConversionLetters.npos) {
            checkUnknown(part);
        } else if (part.brace == PatternPart::kNone) {
            return;
        } else if (part.letter == 'd') {
            const std::size_t size = part.argument(_pattern).size();
            if (size > 0) findInDate(_value.part(part.brace + 1, size), _to);
        } else {
            const Piece argument = _value.part(part.brace, part.end - part.brace);
            tell(_to, Code::PATTERN_ARGUMENT, argument.place(),
                 quoted(argument.text()) + " has no effect behind %" + part.letter +
                     ": only %d takes an argument; a width, as in %.20" + part.letter +
                     ", cuts the text",
                 std::string(_pattern.substr(part.begin, part.brace - part.begin)),
                 argument.replacedBy(""));
        }
    }

    // "%msg" and the like; false: it is none of them.
    bool checkWord(const PatternPart& part) {
        std::size_t end = part.letterAt;
        while (end < _pattern.size() && isLetter(_pattern[end]))
            ++end;
        const std::string_view word = _pattern.substr(part.letterAt, end - part.letterAt);
        for (const auto& [name, letter] : kWords) {
            if (word != name) continue;
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

    void checkUnknown(const PatternPart& part) {
        const std::string meant = meantLetter(part.letter);
        const bool sure = !meant.empty() && part.letter != 'C';
        const Piece letter = _value.part(part.letterAt, 1);
        tell(_to, Code::PATTERN_UNKNOWN, piece(part).place(),
             "there is no conversion " + quoted(part.in(_pattern)) + ": it prints nothing" +
                 hintFor(part.letter),
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
};

}  // namespace

void findInPatterns(const Reading& reading, Findings& to) {
    for (const Appender* const appender : reading.config.everyAppender()) {
        const ConfigStatement* const said = lastOf(*appender, "layout.ConversionPattern");
        if (said == nullptr) continue;
        const Piece value = valueOf(reading.source, *said);
        if (value.size() > 0) PatternCheck(value, to).run();
    }
}
