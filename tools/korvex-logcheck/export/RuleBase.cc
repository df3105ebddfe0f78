#include "export/RuleBase.h"

#include "export/Engines.h"
#include "export/Quote.h"

namespace {

// Text of a rule: what would begin a field, or an escape, is said otherwise.
std::string ruleText(const std::string& text) {
    std::string all;
    for (const char c : text) {
        if (c == '%' || c == '\\') all += c;
        all += c;
    }
    return all;
}

// A JSON string in a rule. liblognorm 2.0.6 crashes at a percent sign in it.
std::string ruleString(const std::string& text) {
    std::string all;
    for (const char c : jsonString(text))
        all += c == '%' ? "\\u0025" : std::string(1, c);
    return all;
}

std::string parser(const std::string& name, const std::string& type, const std::string& more = "") {
    return "%{\"name\":" + ruleString(name) + ",\"type\":\"" + type + '"' + more + "}%";
}

std::string upTo(const std::string& name, const std::string& end) {
    // string-to finds no string of one byte.
    return parser(name, end.size() == 1 ? "char-to" : "string-to",
                  ",\"extradata\":" + ruleString(end));
}

std::string nameFor(const LineField& field) {
    return field.repeated ? "-" : nameOf(field.kind);
}

// Writes the rule for lines of one level.
class RuleWriter {
  public:
    RuleWriter(const LineShape& shape, std::size_t level, RuleBase& base)
        : _shape(shape), _level(level), _base(base) {}

    std::string rule() {
        _base.timeJoints.clear();
        _base.padded.clear();
        for (const LineField& field : _shape.head())
            add(field);
        return _rule + "%message:rest%";
    }

  private:
    void add(const LineField& field) {
        switch (field.kind) {
            case LineField::TEXT:
                _rule += ruleText(field.text);
                break;
            case LineField::TIME:
                addTime(field);
                break;
            case LineField::LEVEL:
                addLevel(field.words[_level], nameFor(field));
                break;
            case LineField::CHANNEL:
            case LineField::THREAD:
                addName(field);
                break;
            default:
                addNumber(field);
        }
    }

    const LineField* next(const LineField& field) const {
        const LineField* const end = _shape.head().data() + _shape.head().size();
        return &field + 1 == end ? nullptr : &field + 1;
    }

    void addLevel(const LevelWord& word, const std::string& name) {
        _rule += ruleText(word.before) +
                 parser(name, "literal", ",\"text\":" + ruleString(word.word)) +
                 ruleText(word.behind);
    }

    void addName(const LineField& field) {
        const std::string name = nameFor(field);
        const std::string& end = next(field)->text;
        if (!isBlank(end)) {
            _rule += upTo(name, end);
            if (field.filling != LineField::NONE && !field.repeated) _base.padded.push_back(name);
            return;
        }
        if (field.filling == LineField::BLANKS_BEFORE) {
            throw Inexpressible("blanks in front of the " + name + " cannot be skipped");
        }
        _rule += parser(name, "word");
        // The next text's blanks are looked for where the padding ends.
        if (field.filling == LineField::BLANKS_BEHIND) {
            throw Inexpressible("blanks after the " + name + " cannot be skipped");
        }
    }

    void addNumber(const LineField& field) {
        const bool plain =
            field.filling == LineField::NONE || field.filling == LineField::ZEROS_BEFORE;
        if (!plain) throw Inexpressible("blanks that fill up a number cannot be skipped");
        _rule += parser(nameFor(field), "number");
    }

    // Each piece without blanks is one field.
    void addTime(const LineField& field) {
        unsigned pieces = 0;
        const auto flush = [&](const std::string& end) {
            const std::string name = field.repeated ? "-" : "time" + std::to_string(++pieces);
            _rule += isBlank(end.substr(0, 1)) ? parser(name, "word") : upTo(name, end);
        };
        std::string plain;  // of the piece: what its end must not look like
        for (const TimePart& part : field.time) {
            if (part.letter == 'e')
                throw Inexpressible("a blank within a date (%e) cannot be told");
            if (part.letter != 0) continue;
            const std::size_t begin = part.text.find_first_of(" \t");
            if (begin == part.text.npos) {
                plain += part.text;
                continue;
            }
            const std::size_t end = part.text.find_last_of(" \t") + 1;
            const std::string gap = part.text.substr(begin, end - begin);
            if (!isBlank(gap)) throw Inexpressible("a text within a date cannot be told");
            flush(gap);
            _rule += gap;
            if (!field.repeated) _base.timeJoints.push_back(gap);
            plain = part.text.substr(end);
        }
        const LineField* const behind = next(field);
        if (behind == nullptr || behind->kind != LineField::TEXT) {
            throw Inexpressible("where the date ends cannot be told without a text after it");
        }
        if (!isBlank(behind->text.substr(0, 1)) && plain.find(behind->text) != plain.npos) {
            throw Inexpressible("where the date ends cannot be told: " + jsonString(behind->text) +
                                " is part of it");
        }
        flush(behind->text);
    }

    const LineShape& _shape;
    const std::size_t _level;
    RuleBase& _base;
    std::string _rule;
};

}  // namespace

RuleBase ruleBaseOf(const LineShape& shape) {
    RuleBase base;
    const LineField* const level = shape.find(LineField::LEVEL);
    const std::size_t rules = level != nullptr ? level->words.size() : 1;
    for (std::size_t i = 0; i < rules; ++i)
        base.rules.push_back("rule=:" + RuleWriter(shape, i, base).rule());
    return base;
}
