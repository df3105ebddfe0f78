#include "export/LineShape.h"

#include <algorithm>
#include <set>

#include "export/LineFields.h"
#include "export/TimeParts.h"

namespace {

using Fields = std::vector<LineField>;
using Kind = LineField::Kind;

bool isName(const LineField& field) {
    return field.kind == LineField::CHANNEL || field.kind == LineField::THREAD;
}

bool isNumber(const LineField& field) {
    return field.kind == LineField::UPTIME_MS || field.kind == LineField::UPTIME_S ||
           field.kind == LineField::CPU_TICKS ||
           (field.kind == LineField::TIME && endsInFreeNumber(field.time));
}

bool mayBeginWithBlank(const LineField& field) {
    return field.kind == LineField::MESSAGE || field.kind == LineField::THREAD;
}

bool beginsWithDigit(const LineField& field) {
    if (field.kind == LineField::TEXT) return field.text[0] >= '0' && field.text[0] <= '9';
    if (field.kind == LineField::LEVEL) return field.words[INFO].before[0] == '0';
    return true;
}

std::string the(const LineField& field) {
    return std::string("the ") + nameOf(field.kind);
}

// What follows shows where a name ends.
void checkName(const LineField& name, const LineField& next) {
    if (next.kind != LineField::TEXT) {
        throw Doubt("nothing stands between " + the(name) + " and " + the(next));
    }
    if (name.kind == LineField::THREAD && isBlank(next.text)) {
        throw Doubt(
            "only a blank ends the thread's name, and names such as \"Main Thread\" have "
            "blanks");
    }
}

// What follows shows where the blanks end that fill a field up.
void checkFilling(const LineField& field, const LineField* behind) {
    if (field.filling != LineField::BLANKS_BEHIND) return;
    if (behind->kind == LineField::TEXT && isBlank(behind->text)) ++behind;
    if (mayBeginWithBlank(*behind)) {
        throw Doubt("the blanks that fill up " + the(field) + " run into " + the(*behind));
    }
}

void checkHead(const Fields& fields) {
    for (const LineField& field : fields) {
        if (field.kind == LineField::MESSAGE) return;
        const LineField& next = *(&field + 1);
        if (field.kind == LineField::TEXT && field.text.find('\n') != std::string::npos) {
            throw Doubt("a newline stands in front of the message");
        }
        if (isName(field)) checkName(field, next);
        if (isNumber(field) && beginsWithDigit(next)) {
            throw Doubt("nothing ends the number in front of " + the(next));
        }
        checkFilling(field, &next);
    }
}

void checkEnd(const Fields& fields) {
    const auto isMessage = [](const LineField& field) { return field.kind == LineField::MESSAGE; };
    const auto message = std::find_if(fields.begin(), fields.end(), isMessage);
    if (message == fields.end()) throw Doubt("it does not print the message (%m)");
    const auto behind = message + 1;
    if (behind == fields.end()) throw Doubt("its lines do not end (%n)");
    if (behind->kind != LineField::TEXT || behind->text != "\n" || behind + 1 != fields.end()) {
        throw Doubt("the message may be of any text, so nothing but %n can come after it");
    }
}

void checkTime(const Fields& fields) {
    std::string missing = "a time stamp";
    for (const LineField& field : fields) {
        if (field.kind != LineField::TIME) continue;
        missing = missingIn(field.time);
        if (missing.empty()) return;
    }
    throw Doubt("its lines have no " + missing.substr(missing.find(' ') + 1));
}

}  // namespace

const char* nameOf(Kind kind) {
    static const char* const names[] = {"text",      "time",     "level",     "channel", "thread",
                                        "uptime_ms", "uptime_s", "cpu_ticks", "message"};
    return names[kind];
}

bool isBlank(const std::string& text) {
    return text.find_first_not_of(" \t") == text.npos;
}

LineShape::LineShape(const LogFormat& layout) : _head(fieldsOf(LayoutPieces::of(layout))) {
    checkEnd(_head);
    checkHead(_head);
    checkTime(_head);
    _head.resize(_head.size() - 2);
    // The time is the one that is complete.
    std::set<Kind> seen;
    for (LineField& field : _head) {
        const bool partial = field.kind == LineField::TIME && !missingIn(field.time).empty();
        field.repeated = partial || !seen.insert(field.kind).second;
    }
}

const LineField* LineShape::find(Kind kind) const {
    for (const LineField& field : _head)
        if (field.kind == kind && !field.repeated) return &field;
    return nullptr;
}

bool LineShape::hides(const std::string& channelName) const {
    for (std::size_t i = 0; i + 1 < _head.size(); ++i) {
        if (_head[i].kind != LineField::CHANNEL) continue;
        const std::string& end = _head[i + 1].text;
        if (channelName.find(end) != std::string::npos) return true;
        if (isBlank(end) && channelName.find_first_of(" \t") != std::string::npos) return true;
    }
    return false;
}

std::string LineShape::suggestion(const LogFormat& layout) {
    std::string numbers;
    std::string thread;
    for (const LayoutPiece& piece : LayoutPieces::of(layout)) {
        if (piece.what == LayoutPiece::THREAD) thread = " [%t]";
        if (piece.what == LayoutPiece::EPOCH_MSEC) numbers += " %r";
        if (piece.what == LayoutPiece::EPOCH_SEC) numbers += " %R";
        if (piece.what == LayoutPiece::PROCESSOR_TIME) numbers += " %u";
    }
    return "%d{ISO8601}" + numbers + thread + " %-5p %c: %m%n";
}
