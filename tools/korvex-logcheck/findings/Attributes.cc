#include "findings/Attributes.h"

#include <algorithm>

#include "Text.h"
#include "findings/AttributeNames.h"
#include "findings/MeantAppender.h"
#include "findings/NearMiss.h"

const ConfigStatement* lastOf(const Appender& appender, std::string_view attribute) {
    const ConfigStatement* last = nullptr;
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted && said.attribute == attribute) last = &said;
    }
    return last;
}

bool isSpokenOf(const Appender& appender, std::string_view attribute) {
    return std::any_of(appender.attributes.begin(), appender.attributes.end(),
                       [=](const ConfigStatement& said) { return said.attribute == attribute; });
}

namespace {

// "appnder.MAIN.fileName=...", or with a colon.
bool isRefusedElsewhere(const Configuration& config, const Source& source,
                        const std::string& appender, const std::string& attribute) {
    const std::string start = '.' + appender + '.';
    for (const auto& [lineno, text] : config.parseErrors) {
        const std::string& line = source.line(lineno).text;
        const std::size_t name = line.find(start);
        if (name == line.npos) continue;
        const std::string rest = line.substr(name + start.size());
        const std::string word = rest.substr(0, rest.find_first_of("=: \t"));
        if (meantAttribute(word).name == attribute || beginsWith(rest, attribute)) return true;
    }
    return false;
}

bool isSetOfMisspelt(const Configuration& config, const std::string& appender,
                     const std::string& attribute) {
    return std::any_of(
        config.appenders.begin(), config.appenders.end(), [&](const Appender& other) {
            const bool sets = isSpokenOf(other, attribute) || endsWith(other.name, attribute);
            return sets && other.name != appender && meantAppender(config, other) == appender;
        });
}

}  // namespace

bool isMeantToBeSet(const Configuration& config, const Source& source, const Appender& appender,
                    const std::string& attribute) {
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted) continue;
        if (meantAttribute(said.attribute).name == attribute) return true;
        if (nearestTo(said.attribute, attributeNames()) == attribute) return true;
    }
    return isRefusedElsewhere(config, source, appender.name, attribute) ||
           isSetOfMisspelt(config, appender.name, attribute);
}
