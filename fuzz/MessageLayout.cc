#include <korvex/util/Logger.h>

#include <cstdlib>
#include <stdexcept>

#include "Check.h"
#include "Input.h"
#include "reference/Layout.h"

// A stamp, a message (a line) and a pattern: laid out as the slow way does it.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const bool inTime = setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1) == 0;
    check(inTime, "TZ");
    if (size > 300) return 0;
    Input input(data, size);
    const int sec = static_cast<int>(input.number(4));
    const int usec = static_cast<int>(input.number(3) % 1000000);
    static const Logger logger("a channel");
    LogMsgMetadata facts(&logger, static_cast<LogLevel>(input.number(1) % 9 * 10));
    const std::string message = input.line();
    const std::string pattern = upToNul(input.rest());
    if (!reference::isReasonable(pattern)) return 0;

    facts.stamp.set(sec, usec);
    reference::Line line{message, "a channel", "", "Main Thread", 0, sec, usec};
    unsigned long length = 0;
    line.level = loglevel2str(&length, facts.level);
    line.epochMsec =
        static_cast<std::uint64_t>(Timeval::msecDifference(facts.stamp, epoch_timeval()));
    const auto expected = reference::layOut(pattern, line);
    const LogFormat layout(pattern.c_str());
    std::string got;
    bool threw = false;
    try {
        layout.apply(got, facts, message);
    } catch (const std::length_error&) {
        threw = true;
    }
    check(threw == !expected, "an empty piece is what throws");
    if (expected) checkSame(got, *expected, pattern.c_str());
    return 0;
}
