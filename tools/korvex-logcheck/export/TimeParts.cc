#include "export/TimeParts.h"

#include <string_view>

namespace {

constexpr unsigned kNoFixedLength = 0;

bool isOneOf(char c, std::string_view set) {
    return set.find(c) != std::string_view::npos;
}

void addText(std::vector<TimePart>& to, const std::string& text) {
    if (text.empty()) return;
    if (text.find_first_of("\n\r") != text.npos) throw Doubt("its date has a newline in it");
    if (!to.empty() && to.back().letter == 0) {
        to.back().text += text;
    } else {
        to.push_back({0, text});
    }
}

void addPattern(std::vector<TimePart>& to, const std::string& pattern);

void addConversion(std::vector<TimePart>& to, char letter) {
    if (letter == 'h') letter = 'b';
    if (letter == '%') return addText(to, "%");
    if (letter == 't') return addText(to, "\t");
    if (letter == 'n') return addText(to, "\n");
    if (letter == 'F') return addPattern(to, "%Y-%m-%d");
    if (letter == 'T') return addPattern(to, "%H:%M:%S");
    if (letter == 'R') return addPattern(to, "%H:%M");
    if (letter == 'Z') throw Doubt("%Z in its date does not say which time zone is meant; %z does");
    if (letter == 'y' || letter == 'D') {
        throw Doubt(std::string("%") + letter + " in its date leaves the century open");
    }
    if (!isOneOf(letter, "YmdeHIMSpbBaAsz")) {
        throw Doubt("its date has a conversion that is not known here: %" + std::string(1, letter));
    }
    to.push_back({letter, {}});
}

void addPattern(std::vector<TimePart>& to, const std::string& pattern) {
    for (std::size_t i = 0; i < pattern.size(); ++i) {
        if (pattern[i] != '%') {
            addText(to, std::string(1, pattern[i]));
        } else if (++i < pattern.size()) {
            addConversion(to, pattern[i]);
        } else {
            throw Doubt("its date ends in a percent sign");
        }
    }
}

// In bytes, of the text that the part prints.
unsigned lengthOf(const TimePart& part) {
    if (part.letter == 0) return static_cast<unsigned>(part.text.size());
    if (isOneOf(part.letter, "BAs")) return kNoFixedLength;
    if (isOneOf(part.letter, "ab") || part.letter == 'l') return 3;
    if (part.letter == 'Y') return 4;
    return part.letter == 'z' ? 5 : 2;
}

unsigned lengthOf(const std::vector<TimePart>& parts) {
    unsigned all = 0;
    for (const TimePart& part : parts) {
        const unsigned length = lengthOf(part);
        if (length == kNoFixedLength) throw Doubt("a date of no fixed length is cut or padded");
        all += length;
    }
    return all;
}

void cut(std::vector<TimePart>& parts, unsigned width) {
    std::vector<TimePart> kept;
    for (TimePart& part : parts) {
        const unsigned length = lengthOf(part);
        if (length > width && part.letter != 0 && width != 0) {
            throw Doubt("a width cuts its date within a number or a word");
        }
        if (part.letter == 0) part.text.resize(std::min(length, width));
        if (width != 0) kept.push_back(part);
        width -= std::min(length, width);
    }
    parts = kept;
}

}  // namespace

std::vector<TimePart> timePartsOf(const LayoutPiece& piece) {
    std::vector<TimePart> parts;
    for (const DatePiece& one : piece.date) {
        if (one.isMsec) {
            parts.push_back({'l', {}});
        } else {
            addPattern(parts, one.pattern);
        }
    }
    if (piece.minWidth == 0 && piece.maxWidth == LayoutPiece::kUnlimited) return parts;
    const unsigned length = lengthOf(parts);
    if (piece.maxWidth < length) {
        cut(parts, piece.maxWidth);
    } else if (length < piece.minWidth) {
        const unsigned missing = piece.minWidth - length;
        if (missing > 1000) throw Doubt("its date is padded to a width that cannot be meant");
        const std::string padding(missing, piece.padding != 0 ? piece.padding : ' ');
        if (piece.padding == 0) {
            addText(parts, padding);
        } else if (!parts.empty() && parts.front().letter == 0) {
            parts.front().text.insert(0, padding);
        } else {
            parts.insert(parts.begin(), {0, padding});
        }
    }
    return parts;
}

std::string missingIn(const std::vector<TimePart>& parts) {
    std::string letters;
    for (const TimePart& part : parts)
        if (part.letter != 0) letters += part.letter;
    const auto has = [&](std::string_view any) {
        return letters.find_first_of(any) != letters.npos;
    };
    if (has("s")) return "";
    const bool hour = has("H") || (has("I") && has("p"));
    if (!has("Y")) return "the year";
    if (!has("mbB") || !has("de")) return "the day";
    return hour && has("M") && has("S") ? "" : "the time of day";
}

bool endsInFreeNumber(const std::vector<TimePart>& parts) {
    return !parts.empty() && parts.back().letter == 's';
}

std::vector<std::string> wordsOfLetter(char letter) {
    std::vector<std::string> words;
    if (letter == 'p') return {"AM", "PM"};
    if (isOneOf(letter, "aA")) {
        words = {"Monday", "Tuesday", "Wednesday", "Thursday", "Friday", "Saturday", "Sunday"};
    } else if (isOneOf(letter, "bB")) {
        words = {"January", "February", "March",     "April",   "May",      "June",
                 "July",    "August",   "September", "October", "November", "December"};
    }
    if (isOneOf(letter, "ab"))
        for (std::string& word : words)
            word.resize(3);
    return words;
}
