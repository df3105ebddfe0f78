#include "Sample.h"

#include <algorithm>
#include <ctime>
#include <exception>

#include "PatternText.h"

namespace {

LogLevel sampleLevel(const LogChannel& channel) {
    for (const LogLevel level : {INFO, WARN, ERROR, CRIT, FATAL}) {
        if (channel.passes(level)) return level;
    }
    return EMERG;
}

Timeval sampleTime() {
    struct tm local {};
    local.tm_year = 107;
    local.tm_mon = 2;
    local.tm_mday = 5;
    local.tm_hour = 14;
    local.tm_min = 3;
    local.tm_sec = 9;
    local.tm_isdst = -1;
    Timeval time;
    time.set(static_cast<int>(std::mktime(&local)), 7000);
    return time;
}

// Whether a conversion of the text has a width of six digits and more, behind its flags.
bool hasHugeWidth(std::string_view text) {
    constexpr std::size_t most = 5;
    for (std::size_t pos = 0; (pos = text.find('%', pos)) != text.npos;) {
        pos = std::min(text.find_first_not_of("-_0^#+", pos + 1), text.size());
        const std::size_t end = std::min(text.find_first_not_of("0123456789", pos), text.size());
        if (end - pos > most) return true;
    }
    return false;
}

// Whether the pattern pads something to a width of six digits and more: surely a slip, and not
// worth gigabytes of blanks here.
bool isHuge(const std::string& pattern) {
    const std::vector<PatternPart> parts = partsOf(pattern);
    return std::any_of(parts.begin(), parts.end(), [&](const PatternPart& part) {
        return part.kind == PatternPart::CONVERSION && hasHugeWidth(part.in(pattern));
    });
}

// What the conversions print that change from one moment to the next; null: another one.
const char* fixedText(char letter) {
    if (letter == 'r') return "2500";
    if (letter == 'R') return "2";
    return letter == 'u' ? "10000" : nullptr;
}

// The pattern with those conversions already laid out.
std::string fixedPattern(const std::string& pattern, const LogMsgMetadata& md) {
    std::string fixed;
    for (const PatternPart& part : partsOf(pattern)) {
        const char* const text =
            part.kind == PatternPart::CONVERSION ? fixedText(part.letter) : nullptr;
        if (text == nullptr) {
            fixed += part.in(pattern);
            continue;
        }
        const std::string widths = pattern.substr(part.begin, part.letterAt - part.begin);
        LogFormat((widths + 'm').c_str()).apply(fixed, md, text);
    }
    return fixed;
}

}  // namespace

Sample sampleLine(const LogAppender& appender, const std::string& channelName,
                  const LogChannel& channel) {
    const Logger logger(channelName.c_str());
    const std::string& pattern = appender.layout().pattern();
    Sample sample;
    if (isHuge(pattern)) {
        sample.failure = kTooWide;
        return sample;
    }
    LogMsgMetadata md(&logger, sampleLevel(channel));
    md.stamp = sampleTime();
    try {
        LogFormat(fixedPattern(pattern, md).c_str()).apply(sample.line, md, "this is a message");
    } catch (const std::exception& e) {
        sample.failure = std::string("fails, so messages go to standard error: ") + e.what();
    }
    return sample;
}
