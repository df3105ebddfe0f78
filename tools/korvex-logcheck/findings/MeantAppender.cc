#include "findings/MeantAppender.h"

#include <algorithm>

#include "Text.h"
#include "findings/AttributeNames.h"
#include "findings/Attributes.h"
#include "findings/NearMiss.h"

namespace {

// "MAINfileName": the dot is missing.
bool isGrownTogether(const std::string& name, const std::string& appender) {
    const std::vector<std::string>& all = attributeNames();
    return std::any_of(all.begin(), all.end(),
                       [&](const std::string& attribute) { return name == appender + attribute; });
}

bool haveOneInCommon(const Appender& a, const Appender& b) {
    return std::any_of(a.attributes.begin(), a.attributes.end(),
                       [&](const ConfigStatement& said) { return isSpokenOf(b, said.attribute); });
}

}  // namespace

std::string meantAppender(const Configuration& config, const Appender& appender) {
    if (!config.users(*appender.made).empty()) return "";
    std::vector<std::string> others;
    for (const Appender& other : config.appenders) {
        if (config.users(*other.made).empty()) continue;
        if (isGrownTogether(appender.name, other.name)) return other.name;
        if (!haveOneInCommon(appender, other)) others.push_back(other.name);
    }
    return nearestTo(appender.name, others);
}
