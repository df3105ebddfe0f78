#include "findings/Attributes.h"

#include <algorithm>

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
