#include "Findings.h"
#include "Sample.h"
#include "Text.h"

namespace {

const std::string kPattern = "layout.ConversionPattern";

// A named layout and a pattern: the one that comes later counts. PatternLayout only announces.
void checkChoice(const Appender& appender, Findings& to) {
    const ConfigStatement* chosen = nullptr;
    const ConfigStatement* announced = nullptr;
    for (const ConfigStatement& said : appender.attributes) {
        if (!said.accepted) continue;
        if (said.attribute == "layout" && said.value == "PatternLayout") {
            announced = &said;
        } else if (said.attribute == "layout" || said.attribute == kPattern) {
            if (chosen != nullptr && chosen->attribute != said.attribute) {
                warn(to, chosen->lineno,
                     chosen->attribute + " of " + quoted(appender.name) + " is overruled by line " +
                         std::to_string(said.lineno));
            }
            chosen = &said;
        }
    }
    if (announced != nullptr && chosen == nullptr) {
        warn(to, announced->lineno,
             "PatternLayout of " + quoted(appender.name) + " comes without " + kPattern +
                 ": the layout is " + quoted(appender.made->layout().pattern()));
    }
}

void checkSample(const Configuration& config, const Appender& appender, Findings& to) {
    unsigned lineno = 0;
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted && said.attribute.find("layout") == 0) lineno = said.lineno;
    }
    if (lineno == 0) return;
    const Sample sample = sampleLine(*appender.made, "sample", *config.root.made);
    if (!sample.failure.empty()) {
        warn(to, lineno,
             "the layout of " + quoted(appender.name) + ' ' + printable(sample.failure));
    } else if (sample.line.empty() || sample.line.back() != '\n') {
        warn(to, lineno,
             "the layout of " + quoted(appender.name) +
                 " does not end in %n: its lines run into each other");
    }
}

}  // namespace

void findInLayouts(const Configuration& config, Findings& to) {
    for (const Appender* const appender : config.everyAppender()) {
        checkChoice(*appender, to);
        checkSample(config, *appender, to);
    }
}
