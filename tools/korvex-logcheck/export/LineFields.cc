#include "export/LineFields.h"

#include <algorithm>

#include "export/TimeParts.h"

namespace {

constexpr unsigned kDigitsOfNumber = 20;  // of the largest that a layout prints
constexpr unsigned kSensibleWidth = 1000;

// The text as the piece prints it, in its parts.
struct Fitted {
    std::string before, text, behind;
};

Fitted fit(const std::string& text, const LayoutPiece& piece) {
    if (piece.maxWidth < text.size()) return {"", text.substr(0, piece.maxWidth), ""};
    if (text.size() >= piece.minWidth) return {"", text, ""};
    if (piece.minWidth > kSensibleWidth) throw Doubt("it pads to a width that cannot be meant");
    const std::size_t missing = piece.minWidth - text.size();
    if (piece.padding == 0) return {"", text, std::string(missing, ' ')};
    return {std::string(missing, piece.padding), text, ""};
}

std::vector<LevelWord> levelWords(const LayoutPiece& piece) {
    std::vector<LevelWord> words;
    for (int i = DEBUG; i <= EMERG + 1; ++i) {
        const auto level = static_cast<LogLevel>(i);
        unsigned long length = 0;
        const std::string name = loglevel2str(&length, level);
        const Fitted shown = fit(name, piece);
        for (const LevelWord& other : words) {
            if (other.word == shown.text) {
                throw Doubt("it cuts " + other.name + " and " + name + " to the same letters");
            }
        }
        words.push_back({level, name, shown.text, shown.before, shown.behind});
    }
    return words;
}

LineField::Filling fillingOf(const LayoutPiece& piece) {
    if (piece.minWidth == 0) return LineField::NONE;
    if (piece.padding == 0) return LineField::BLANKS_BEHIND;
    return piece.padding == '0' ? LineField::ZEROS_BEFORE : LineField::BLANKS_BEFORE;
}

LineField nameField(LineField::Kind kind, const LayoutPiece& piece) {
    const LineField::Filling filling = fillingOf(piece);
    if (filling == LineField::ZEROS_BEFORE) {
        throw Doubt(std::string("zeros in front of the ") + nameOf(kind) + " may be its own");
    }
    return {kind, {}, {}, {}, filling};
}

LineField numberField(LineField::Kind kind, const LayoutPiece& piece) {
    if (piece.maxWidth < kDigitsOfNumber) throw Doubt("it cuts a number");
    return {kind, {}, {}, {}, fillingOf(piece)};
}

LineField messageField(const LayoutPiece& piece) {
    if (piece.minWidth != 0) throw Doubt("what pads the message may be its own");
    return {LineField::MESSAGE, {}, {}, {}};
}

LineField fieldOf(const LayoutPiece& piece) {
    switch (piece.what) {
        case LayoutPiece::LITERAL: {
            const Fitted shown = fit(piece.literal, piece);
            return {LineField::TEXT, shown.before + shown.text + shown.behind, {}, {}};
        }
        case LayoutPiece::MESSAGE:
            return messageField(piece);
        case LayoutPiece::CHANNEL:
            return nameField(LineField::CHANNEL, piece);
        case LayoutPiece::LEVEL:
            return {LineField::LEVEL, {}, {}, levelWords(piece)};
        case LayoutPiece::THREAD:
            return nameField(LineField::THREAD, piece);
        case LayoutPiece::EPOCH_MSEC:
            return numberField(LineField::UPTIME_MS, piece);
        case LayoutPiece::EPOCH_SEC:
            return numberField(LineField::UPTIME_S, piece);
        case LayoutPiece::PROCESSOR_TIME:
            return numberField(LineField::CPU_TICKS, piece);
        case LayoutPiece::DATE:
        case LayoutPiece::OTHER:
            break;
    }
    throw Doubt("it has a conversion that is not known here");
}

bool printsNothing(const LayoutPiece& piece) {
    if (piece.what == LayoutPiece::LITERAL) return false;
    return piece.maxWidth == 0 && piece.minWidth == 0;
}

// Dates with nothing but text between them, none of them complete by itself, are one: a day and
// a time of day.
void joinDates(std::vector<LineField>& fields) {
    const auto isTime = [](const LineField& field) { return field.kind == LineField::TIME; };
    for (const LineField& field : fields)
        if (isTime(field) && missingIn(field.time).empty()) return;
    const auto first = std::find_if(fields.begin(), fields.end(), isTime);
    while (first != fields.end() && first + 1 != fields.end()) {
        auto next = first + 1;
        const bool hasText = next->kind == LineField::TEXT;
        if (hasText && ++next == fields.end()) return;
        if (!isTime(*next)) return;
        if (hasText) first->time.push_back({0, (first + 1)->text});
        first->time.insert(first->time.end(), next->time.begin(), next->time.end());
        fields.erase(first + 1, next + 1);
    }
}

// Texts side by side are one.
void add(std::vector<LineField>& to, const LineField& field) {
    if (field.kind == LineField::TEXT && field.text.empty()) return;
    if (field.kind == LineField::TEXT && !to.empty() && to.back().kind == LineField::TEXT) {
        to.back().text += field.text;
    } else {
        to.push_back(field);
    }
}

// A date without the texts at its ends, which are texts of the line.
void addDate(std::vector<LineField>& to, std::vector<TimePart> parts) {
    std::string behind;
    if (!parts.empty() && parts.front().letter == 0) {
        add(to, {LineField::TEXT, parts.front().text, {}, {}});
        parts.erase(parts.begin());
    }
    if (!parts.empty() && parts.back().letter == 0) {
        behind = parts.back().text;
        parts.pop_back();
    }
    if (!parts.empty()) add(to, {LineField::TIME, {}, parts, {}});
    add(to, {LineField::TEXT, behind, {}, {}});
}

}  // namespace

std::vector<LineField> fieldsOf(const std::vector<LayoutPiece>& pieces) {
    std::vector<LineField> fields;
    for (const LayoutPiece& piece : pieces) {
        if (printsNothing(piece)) continue;
        if (piece.what == LayoutPiece::DATE) {
            addDate(fields, timePartsOf(piece));
        } else {
            add(fields, fieldOf(piece));
        }
    }
    joinDates(fields);
    return fields;
}
