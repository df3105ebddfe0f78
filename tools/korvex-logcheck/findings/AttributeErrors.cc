#include <korvex/util/Logger/ValidUint.h>

#include <algorithm>

#include "Text.h"
#include "findings/AttributeNames.h"
#include "findings/Findings.h"
#include "findings/NearMiss.h"
#include "findings/NumberText.h"

namespace {

const char* const kLayouts = "the layouts are BasicLayout, SimpleLayout and PatternLayout";

// The value without the blank or "#" that it keeps; what of it is to be cut lies behind.
std::size_t sizeWithoutTail(std::string_view value) {
    std::size_t size = value.size();
    while (size > 0 &&
           (value[size - 1] == ' ' || value[size - 1] == '\t' || value[size - 1] == '#'))
        --size;
    return size;
}

// The value becomes what is meant, and what it kept of the line's end goes.
std::vector<Edit> mend(const Source& source, const Piece& value, const std::string& meant) {
    const std::size_t size = sizeWithoutTail(value.text());
    std::vector<Edit> edits;
    if (value.text().substr(0, size) != meant) edits = value.part(0, size).replacedBy(meant);
    if (size < value.size()) {
        const std::vector<Edit> tail = value.part(size, value.size() - size).cutWithTail(source);
        if (tail.empty()) return {};
        edits.insert(edits.end(), tail.begin(), tail.end());
    }
    return edits;
}

// "10 MB" or "10" with a comment behind it, where digits are meant.
void checkNumber(const Reading& reading, const ConfigStatement& said, Findings& to) {
    const Piece value = valueOf(reading.source, said);
    const std::string error = parseError(reading, said.lineno);
    const std::string bare = said.value.substr(0, sizeWithoutTail(said.value));
    if (isValidUint(bare.c_str())) {
        return tell(to, Code::VALUE_REFUSED_TAIL, value.place(),
                    error + quoted(said.value) +
                        " is not a plain number; a blank or \"#\" after it is part of the value",
                    bare, mend(reading.source, value, bare));
    }
    MeantNumber meant = meantNumber(said.value);
    const bool bytes = said.attribute == "maxFileSize";
    if (meant.unit && !bytes) meant.digits.clear();
    const std::vector<Edit> edits =
        meant.digits.empty() ? std::vector<Edit>() : mend(reading.source, value, meant.digits);
    tell(to, meant.unit && bytes && !meant.digits.empty() ? Code::NUMBER_UNIT : Code::NUMBER_FORM,
         value.place(),
         error + quoted(said.value) + " is not a plain number; use digits only" +
             (bytes ? "; the unit is the byte" : ""),
         meant.digits, edits);
}

// The layout that is spelt like this in any case, with "Layout" or without it.
std::string layoutLike(const std::string& name) {
    for (const char* const known : {"BasicLayout", "SimpleLayout", "PatternLayout"}) {
        const std::string low = lowered(known);
        if (lowered(name) == low || lowered(name) + "layout" == low) return known;
    }
    return "";
}

void checkLayout(const Reading& reading, const ConfigStatement& said, Findings& to) {
    const Piece value = valueOf(reading.source, said);
    const std::string error = parseError(reading, said.lineno);
    const std::string bare = said.value.substr(0, sizeWithoutTail(said.value));
    const std::size_t sign = bare.find_last_of(".:");
    const std::string last = sign == bare.npos ? bare : bare.substr(sign + 1);
    const std::string meant = layoutLike(last);
    if (meant.empty()) {
        return tell(to, sign == bare.npos ? Code::LAYOUT_UNKNOWN : Code::LAYOUT_CLASS,
                    value.place(), error + kLayouts,
                    nearestTo(last, {"BasicLayout", "SimpleLayout", "PatternLayout"}));
    }
    const std::vector<Edit> edits = mend(reading.source, value, meant);
    if (sign != bare.npos) {
        tell(to, Code::LAYOUT_CLASS, value.place(), error + kLayouts + ", without a class in front",
             meant, edits);
    } else if (bare != meant) {
        tell(to, Code::LAYOUT_CASE, value.place(), error + kLayouts, meant, edits);
    } else {
        tell(to, Code::VALUE_REFUSED_TAIL, value.place(),
             error + quoted(said.value) +
                 " is not a layout; a blank or \"#\" after it is part of the value",
             meant, edits);
    }
}

// Attributes of other libraries that have nothing like them here.
const char* hintFor(const std::string& attribute) {
    const std::string low = lowered(attribute);
    if (low == "threshold") return "; a category has a level, an appender has none";
    if (low == "append" || low == "immediateflush" || low == "bufferedio") {
        return "; lines are always appended, and written at once";
    }
    if (low == "datepattern") return "; files are rotated by size, not by date";
    if (low == "target") return "; an appender without fileName writes to standard error";
    return "";
}

void checkName(const Reading& reading, const ConfigStatement& said, Findings& to) {
    const Piece name = attributeOf(reading.source, said);
    const std::string error = parseError(reading, said.lineno);
    const std::string names =
        "the attributes are fileName, maxFileSize, maxBackupIndex, layout and "
        "layout.ConversionPattern";
    const MeantAttribute meant = meantAttribute(said.attribute);
    if (meant.name != said.attribute) {
        return tell(to, meant.slip, name.place(), error + names, meant.name,
                    name.replacedBy(meant.name));
    }
    tell(to, Code::ATTRIBUTE_UNKNOWN, name.place(), error + names + hintFor(said.attribute),
         nearestTo(said.attribute, attributeNames()));
}

}  // namespace

// Of what the library refuses of an appender.
void findInAttributes(const Reading& reading, Findings& to) {
    for (const Appender* const appender : reading.config.everyAppender()) {
        for (const ConfigStatement& said : appender->attributes) {
            if (said.accepted) continue;
            if (said.attribute == "layout") {
                checkLayout(reading, said, to);
            } else if (said.attribute == "maxFileSize" || said.attribute == "maxBackupIndex") {
                checkNumber(reading, said, to);
            } else {
                checkName(reading, said, to);
            }
        }
    }
}
