#include "Sample.h"

#include <exception>

namespace {

LogLevel sampleLevel(const LogChannel& channel) {
    for (const LogLevel level : {INFO, WARN, ERROR, CRIT, FATAL}) {
        if (channel.passes(level)) return level;
    }
    return EMERG;
}

}  // namespace

Sample sampleLine(const LogAppender& appender, const std::string& channelName,
                  const LogChannel& channel) {
    const Logger logger(channelName.c_str());
    Sample sample;
    try {
        appender.layout().apply(sample.line, LogMsgMetadata(&logger, sampleLevel(channel)),
                                "this is a message");
    } catch (const std::exception& e) {
        sample.failure = e.what();
    }
    return sample;
}
