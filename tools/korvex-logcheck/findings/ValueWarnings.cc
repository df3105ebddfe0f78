#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"
#include "findings/PatternEnd.h"

namespace {

// A blank behind a pattern may be meant; one behind its newline begins the next line.
bool isSurelyUnwanted(const ConfigStatement& said, char last) {
    if (said.attribute != "layout.ConversionPattern") return true;
    const std::string_view before = std::string_view(said.value).substr(0, said.value.size() - 1);
    return last != '#' && endsWith(before, "%n") && !endsWith(before, "%%n");
}

void checkTail(const Reading& reading, const ConfigStatement& said, Findings& to) {
    if (said.value.empty()) return;
    const char last = said.value.back();
    const bool blank = last == ' ' || last == '\t';
    if (!blank && last != '#') return;
    const Piece value = valueOf(reading.source, said);
    if (isCutByComment(reading.source, value.line())) return;
    if (said.attribute == "layout.ConversionPattern" &&
        hashInPattern(reading.source, said) != Source::kNone)
        return;
    const Piece tail = value.part(value.size() - 1, 1);
    const bool sure = isSurelyUnwanted(said, last);
    const std::string meant(sure ? value.text().substr(0, value.size() - 1) : "");
    tell(to, Code::VALUE_TAIL, tail.place(),
         said.attribute + " keeps " +
             (blank ? "the blank after it" : "the \"#\" that follows it directly") + ": " +
             quoted(said.value),
         meant, sure ? tail.cutWithTail(reading.source) : std::vector<Edit>());
}

void checkRepeated(const Reading& reading, const Appender& appender, const ConfigStatement& said,
                   Findings& to) {
    const ConfigStatement* const last = lastOf(appender, said.attribute);
    if (last == &said) return;
    tell(to, Code::ATTRIBUTE_REPEATED, attributeOf(reading.source, said).place(),
         said.attribute + " of " + quoted(appender.name) + " is set again on line " +
             std::to_string(last->lineno));
}

}  // namespace

// Of what the library accepts of an appender.
void findInValues(const Reading& reading, Findings& to) {
    for (const Appender* const appender : reading.config.everyAppender()) {
        for (const ConfigStatement& said : appender->attributes) {
            if (!said.accepted) continue;
            checkTail(reading, said, to);
            checkRepeated(reading, *appender, said, to);
        }
    }
}
