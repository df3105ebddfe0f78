#include "Sample.h"

#include <algorithm>
#include <exception>

namespace {

LogLevel sampleLevel(const LogChannel& channel) {
    for (const LogLevel level : {INFO, WARN, ERROR, CRIT, FATAL}) {
        if (channel.passes(level)) return level;
    }
    return EMERG;
}

// Whether the pattern pads something to a width of six digits and more: surely a slip, and not
// worth gigabytes of blanks here.
bool isHuge(const std::string& pattern) {
    const auto digits = [&](std::size_t from) {
        return std::min(pattern.find_first_not_of("0123456789", from), pattern.size()) - from;
    };
    for (std::size_t pos = 0; (pos = pattern.find('%', pos)) != pattern.npos;) {
        pos = std::min(pattern.find_first_not_of("-_0^#+", pos + 1), pattern.size());
        if (digits(pos) >= 6) return true;
    }
    return false;
}

}  // namespace

Sample sampleLine(const LogAppender& appender, const std::string& channelName,
                  const LogChannel& channel) {
    const Logger logger(channelName.c_str());
    Sample sample;
    if (isHuge(appender.layout().pattern())) {
        sample.failure = "asks for a width of six digits";
        return sample;
    }
    try {
        appender.layout().apply(sample.line, LogMsgMetadata(&logger, sampleLevel(channel)),
                                "this is a message");
    } catch (const std::exception& e) {
        sample.failure = std::string("fails, so messages go to standard error: ") + e.what();
    }
    return sample;
}
