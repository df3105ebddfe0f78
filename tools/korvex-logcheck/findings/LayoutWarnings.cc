#include <algorithm>

#include "Sample.h"
#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"

namespace {

const std::string kPattern = "layout.ConversionPattern";

// A named layout and a pattern: the one that comes later counts. PatternLayout only announces.
void checkChoice(const Reading& reading, const Appender& appender, Findings& to) {
    const ConfigStatement* chosen = nullptr;
    const ConfigStatement* announced = nullptr;
    for (const ConfigStatement& said : appender.attributes) {
        if (!said.accepted) continue;
        if (said.attribute == "layout" && said.value == "PatternLayout") {
            announced = &said;
        } else if (said.attribute == "layout" || said.attribute == kPattern) {
            if (chosen != nullptr && chosen->attribute != said.attribute) {
                tell(to, Code::LAYOUT_OVERRULED, attributeOf(reading.source, *chosen).place(),
                     chosen->attribute + " of " + quoted(appender.name) + " is overruled by line " +
                         std::to_string(said.lineno));
            }
            chosen = &said;
        }
    }
    if (announced != nullptr && chosen == nullptr &&
        !isMeantToBeSet(reading.config, reading.source, appender, kPattern)) {
        tell(to, Code::LAYOUT_NO_PATTERN, attributeOf(reading.source, *announced).place(),
             "PatternLayout of " + quoted(appender.name) + " comes without " + kPattern +
                 ": the layout is " + quoted(appender.made->layout().pattern()));
    }
}

// Whether something is told of the layout's line from which it follows that the lines do not end.
bool isTold(const Findings& told, const ConfigStatement& said) {
    return std::any_of(told.begin(), told.end(), [&](const Finding& finding) {
        if (finding.place.line != said.lineno) return false;
        switch (finding.code) {
            case Code::PATTERN_CUT:
            case Code::PATTERN_HASH:
            case Code::PATTERN_QUOTED:
            case Code::COMMENT_OPEN:
                return true;
            case Code::VALUE_TAIL:
                return !finding.meant.empty();
            case Code::PATTERN_BACKSLASH:
                return endsWith(said.value, "\\n");
            case Code::PATTERN_NO_MESSAGE:
                return said.value.empty();
            default:
                return false;
        }
    });
}

void checkSample(const Reading& reading, const Appender& appender, Findings& to) {
    const ConfigStatement* last = nullptr;
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted && said.attribute.find("layout") == 0) last = &said;
    }
    if (last == nullptr) return;
    const Place place = attributeOf(reading.source, *last).place();
    const std::string who = "the layout of " + quoted(appender.name);
    const Sample sample = sampleLine(*appender.made, "sample", *reading.config.root.made);
    if (!sample.failure.empty()) {
        const bool wide = sample.failure == kTooWide;
        tell(to, wide ? Code::PATTERN_WIDTH : Code::PATTERN_FAILS, place,
             who + ' ' + printable(sample.failure));
    } else if (sample.line.empty() || sample.line.back() != '\n') {
        if (isTold(to, *last)) return;
        tell(to, Code::PATTERN_NO_NEWLINE, place,
             who + " does not end in %n: its lines run into each other");
    }
}

}  // namespace

void findInLayouts(const Reading& reading, Findings& to) {
    for (const Appender* const appender : reading.config.everyAppender()) {
        checkChoice(reading, *appender, to);
        checkSample(reading, *appender, to);
    }
}
