#include "export/TimeFormat.h"

#include "export/Engines.h"

namespace {

struct Spelling {
    char letter;
    const char* text;
};

template <std::size_t count>
const char* spelt(char letter, const Spelling (&table)[count], const char* engine) {
    for (const Spelling& one : table)
        if (one.letter == letter) return one.text;
    throw Inexpressible(std::string("%") + letter + " in a date cannot be told to " + engine);
}

// Seconds since 1970, with a point and milliseconds or without.
bool isEpoch(const std::vector<TimePart>& parts) {
    if (parts.front().letter != 's') return false;
    if (parts.size() == 1) return true;
    return parts.size() == 3 && parts[1].text == "." && parts[2].letter == 'l';
}

}  // namespace

std::string strptimeFormat(const LineField& time, const std::string& milliseconds) {
    std::string format;
    for (const TimePart& part : time.time) {
        if (part.letter == 'l') {
            format += milliseconds;
        } else if (part.letter != 0) {
            format += std::string("%") + part.letter;
        } else {
            for (const char c : part.text)
                format += c == '%' ? "%%" : std::string(1, c);
        }
    }
    return format;
}

std::string goFormat(const LineField& time) {
    static constexpr Spelling spellings[] = {
        {'Y', "2006"}, {'m', "01"},  {'d', "02"},      {'e', "_2"},     {'H', "15"},
        {'I', "03"},   {'M', "04"},  {'S', "05"},      {'p', "PM"},     {'b', "Jan"},
        {'a', "Mon"},  {'l', "000"}, {'B', "January"}, {'A', "Monday"}, {'z', "-0700"}};
    if (isEpoch(time.time)) return "Unix";
    std::string format;
    for (const TimePart& part : time.time) {
        const bool isFraction = !format.empty() && (format.back() == '.' || format.back() == ',');
        if (part.letter == 'l' && !isFraction) {
            throw Inexpressible("milliseconds need a point or a comma in front of them");
        }
        if (part.letter != 0) {
            format += spelt(part.letter, spellings, "Go's reader of dates");
        } else if (part.text.find_first_of("0123456789JMPZ_") != part.text.npos) {
            throw Inexpressible("\"" + part.text + "\" in a date means something else to Go");
        } else {
            format += part.text;
        }
    }
    return format;
}

std::string javaFormat(const LineField& time) {
    static constexpr Spelling spellings[] = {
        {'Y', "yyyy"}, {'m', "MM"},  {'d', "dd"},   {'e', "d"},    {'H', "HH"},
        {'I', "hh"},   {'M', "mm"},  {'S', "ss"},   {'p', "a"},    {'b', "MMM"},
        {'a', "EEE"},  {'l', "SSS"}, {'B', "MMMM"}, {'A', "EEEE"}, {'z', "Z"}};
    if (isEpoch(time.time)) return "UNIX";
    std::string format;
    for (const TimePart& part : time.time) {
        if (part.letter != 0) {
            format += spelt(part.letter, spellings, "Java's reader of dates");
            continue;
        }
        for (const char c : part.text) {
            const bool letter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
            format += letter ? std::string("'") + c + '\'' : c == '\'' ? "''" : std::string(1, c);
        }
    }
    return format;
}
