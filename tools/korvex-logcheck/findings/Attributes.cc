#include "findings/Attributes.h"

#include <algorithm>

#include "Text.h"
#include "findings/AttributeNames.h"
#include "findings/KeyText.h"
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

bool isMeantToBeSet(const Configuration& config, const Source& source, const Appender& appender,
                    const std::string& attribute) {
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted) continue;
        if (meantAttribute(said.attribute).name == attribute) return true;
        if (nearestTo(said.attribute, attributeNames()) == attribute) return true;
    }
    const std::string key = "appender." + appender.name + '.' + attribute;
    for (const auto& [lineno, text] : config.parseErrors) {
        const auto mended = mendedKey(source.line(lineno).text);
        if (mended && endsWith(mended->key, key)) return true;
    }
    return false;
}
