#include "findings/MeantAppender.h"

#include "findings/Attributes.h"
#include "findings/NearMiss.h"

std::string meantAppender(const Reading& reading, const Appender& appender) {
    const Configuration& config = reading.config;
    const bool hasFile = isSpokenOf(appender, "fileName") ||
                         isMeantToBeSet(config, reading.source, appender, "fileName");
    if (hasFile || !config.users(*appender.made).empty()) return "";
    std::vector<std::string> used;
    for (const Appender& other : config.appenders) {
        if (!config.users(*other.made).empty()) used.push_back(other.name);
    }
    return nearestTo(appender.name, used);
}
