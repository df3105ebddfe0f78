#include "export/Regex.h"

#include <map>

#include "export/TimeParts.h"

namespace {

std::string grouped(const std::string& expression, const RegexStyle& style) {
    return (style.group != nullptr ? "(?:" : "(") + expression + ')';
}

std::string timePart(const TimePart& part, const RegexStyle& style) {
    switch (part.letter) {
        case 0:
            return escaped(part.text, style);
        case 'Y':
            return "[0-9]{4}";
        case 'l':
            return "[0-9]{3}";
        case 's':
            return "[0-9]+";
        case 'z':
            return "[+-][0-9]{4}";
        case 'e':
            return "[ 0-9][0-9]";
        case 'm':
        case 'd':
        case 'H':
        case 'I':
        case 'M':
        case 'S':
            return "[0-9]{2}";
        default:
            return grouped(anyOf(wordsOfLetter(part.letter), style), style);
    }
}

std::string timeRegex(const LineField& field, const RegexStyle& style) {
    std::string all;
    for (const TimePart& part : field.time)
        all += timePart(part, style);
    return all;
}

// Whether what may begin with blanks comes behind the blanks that fill the field up.
bool isFilledUpToText(const LineShape& shape, const LineField& level) {
    if (level.words.front().behind == level.words.back().behind) return false;
    const LineField* const end = shape.head().data() + shape.head().size();
    const LineField* next = &level + 1;
    if (next != end && next->kind == LineField::TEXT && isBlank(next->text)) ++next;
    return next == end || next->kind == LineField::THREAD;
}

std::string namedGroup(const LineField& field, const std::string& expression,
                       const RegexStyle& style, bool named) {
    if (!named || field.repeated || style.group == nullptr) return grouped(expression, style);
    const std::string name =
        field.kind == LineField::TIME ? style.timeName : std::string(nameOf(field.kind));
    return style.group + name + '>' + expression + ')';
}

// Blanks behind the level's word, as many as that word has: "(?:(?<=DEBUG|ERROR)|(?<=INFO) )".
std::string fillingBehind(const LineField& level, const RegexStyle& style) {
    std::map<std::size_t, std::vector<std::string>> bySize;
    for (const LevelWord& word : level.words)
        bySize[word.behind.size()].push_back(word.word);
    std::string all;
    for (const auto& [size, words] : bySize) {
        all += (all.empty() ? "(?:(?<=" : "|(?<=") + anyOf(words, style) + ')' +
               std::string(size, ' ');
    }
    return all + ')';
}

std::string levelRegex(const LineShape& shape, const LineField& level, const RegexStyle& style,
                       bool named) {
    const LevelWord& shortest = level.words.back();
    const std::string before =
        shortest.before.empty() ? "" : std::string(1, shortest.before[0]) + '*';
    const bool exact = isFilledUpToText(shape, level);
    std::vector<std::string> words;
    for (const LevelWord& word : level.words)
        words.push_back(word.word + (exact && !style.looksBehind ? word.behind : ""));
    std::string behind = exact || shortest.behind.empty() ? "" : " *";
    if (exact && style.looksBehind) behind = fillingBehind(level, style);
    return before + namedGroup(level, anyOf(words, style), style, named) + behind;
}

// Of a name and of a number.
std::string fieldRegex(const LineShape& shape, const LineField& field, const RegexStyle& style,
                       bool named) {
    std::string expression = "[0-9]+";
    if (field.kind == LineField::CHANNEL || field.kind == LineField::THREAD) {
        const LineField* const end = shape.head().data() + shape.head().size();
        const LineField* const next = &field + 1;
        // What is in sight ends it: if that is a blank, the name has none.
        const bool hasBlanks = next == end || !isBlank(next->text);
        if (style.group == nullptr) {
            expression = hasBlanks ? ".+" : "[^[:space:]]+";
        } else {
            expression = hasBlanks ? "[^\\n]+?" : "[^ \\t\\n]+?";
        }
    }
    const std::string group = namedGroup(field, expression, style, named);
    if (field.filling == LineField::BLANKS_BEFORE) return " *" + group;
    return field.filling == LineField::BLANKS_BEHIND ? group + " *" : group;
}

}  // namespace

std::string escaped(const std::string& text, const RegexStyle& style) {
    static const std::string special = "\\.[]{}()*+?^$|";
    // Quotes and slashes end an expression in one engine or another.
    static const std::string quotes = "'\"/";
    std::string all;
    for (const char c : text) {
        if (style.group != nullptr && quotes.find(c) != quotes.npos) {
            all += c == '\'' ? "\\x27" : c == '"' ? "\\x22" : "\\x2F";
        } else {
            if (special.find(c) != special.npos) all += '\\';
            all += c;
        }
    }
    return all;
}

std::string anyOf(const std::vector<std::string>& words, const RegexStyle& style) {
    std::string all;
    for (const std::string& word : words)
        all += (all.empty() ? "" : "|") + escaped(word, style);
    return all;
}

std::string headRegex(const LineShape& shape, const RegexStyle& style, bool named) {
    std::string all = "^";
    for (const LineField& field : shape.head()) {
        if (field.kind == LineField::TEXT) {
            all += escaped(field.text, style);
        } else if (field.kind == LineField::TIME) {
            all += namedGroup(field, timeRegex(field, style), style, named);
        } else if (field.kind == LineField::LEVEL) {
            all += levelRegex(shape, field, style, named);
        } else {
            all += fieldRegex(shape, field, style, named);
        }
    }
    return all;
}

bool levelIsFilled(const LineShape& shape, const RegexStyle& style) {
    const LineField* const level = shape.find(LineField::LEVEL);
    return level != nullptr && !style.looksBehind && isFilledUpToText(shape, *level);
}
