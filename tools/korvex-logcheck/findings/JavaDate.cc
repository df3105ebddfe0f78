#include "findings/JavaDate.h"

#include <algorithm>
#include <utility>

#include "Text.h"

namespace {

struct Field {
    std::string_view java;
    std::string_view here;
};

// The fields without a counterpart here have none.
constexpr Field kFields[] = {
    {"yyyy", "%Y"}, {"yy", "%y"},      {"uuuu", "%Y"}, {"YYYY", "%Y"}, {"MM", "%m"}, {"MMM", "%b"},
    {"MMMM", "%B"}, {"dd", "%d"},      {"d", "%e"},    {"DDD", "%j"},  {"HH", "%H"}, {"hh", "%I"},
    {"mm", "%M"},   {"ss", "%S"},      {"SSS", "%l"},  {"a", "%p"},    {"E", "%a"},  {"EEE", "%a"},
    {"EEEE", "%A"}, {"Z", "%z"},       {"z", "%Z"},    {"ww", "%V"},   {"XX", "%z"}, {"M", ""},
    {"H", ""},      {"h", ""},         {"m", ""},      {"s", ""},      {"S", ""},    {"SS", ""},
    {"SSSSSS", ""}, {"SSSSSSSSS", ""}, {"X", ""},      {"XXX", ""},    {"kk", ""},   {"G", ""},
};

const Field* fieldOf(std::string_view run) {
    for (const Field& field : kFields) {
        if (field.java == run) return &field;
    }
    return nullptr;
}

// The run of one letter that the text begins with.
std::string_view runOf(std::string_view text) {
    return text.substr(0, std::min(text.find_first_not_of(text.front()), text.size()));
}

// What is in quotation marks stands for itself, and two of them for one, also outside.
std::string takeQuoted(std::string_view& text) {
    std::string inside;
    text.remove_prefix(1);
    if (beginsWith(text, "'")) inside = "'";
    for (; !text.empty(); text.remove_prefix(1)) {
        if (text.front() != '\'') {
            inside += text.front();
        } else if (!inside.empty() && beginsWith(text, "''")) {
            inside += '\'';
            text.remove_prefix(1);
        } else {
            text.remove_prefix(1);
            break;
        }
    }
    return inside;
}

}  // namespace

JavaDate javaDate(std::string_view text) {
    std::string pattern;
    bool twoDigits = false;  // one field at least that no word looks like
    bool sure = true;
    while (!text.empty()) {
        if (text.front() == '%') return {false, ""};
        if (text.front() == '\'') {
            pattern += takeQuoted(text);
            continue;
        }
        if (!isLetter(text.front())) {
            pattern += text.front();
            text.remove_prefix(1);
            continue;
        }
        const std::string_view run = runOf(text);
        text.remove_prefix(run.size());
        const Field* const field = fieldOf(run);
        if (field == nullptr && run == "T") {
            pattern += run;  // of ISO 8601, where the quotation marks were forgotten
            continue;
        }
        if (field == nullptr) return {false, ""};
        twoDigits = twoDigits || run.size() >= 2;
        sure = sure && !field->here.empty();
        pattern += field->here;
    }
    // What would read differently again, or end the argument, is not sure.
    sure = sure && pattern.find("%%") == pattern.npos && pattern.find('}') == pattern.npos;
    return {twoDigits, twoDigits && sure ? pattern : ""};
}

bool hasJavaFieldsOnly(std::string_view letters) {
    while (!letters.empty()) {
        const std::string_view run = runOf(letters);
        if (run.size() < 2 || fieldOf(run) == nullptr) return false;
        letters.remove_prefix(run.size());
    }
    return true;
}
