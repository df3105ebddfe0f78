#include <korvex/util/Logger.h>

#include <cstdlib>
#include <stdexcept>

#include "Check.h"
#include "Input.h"
#include "reference/Layout.h"

// A stamp and a date layout: laid out as the slow way does it.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const bool inTime = setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1) == 0;
    check(inTime, "TZ");
    if (size > 200) return 0;
    Input input(data, size);
    const int sec = static_cast<int>(input.number(4));
    const int usec = static_cast<int>(input.number(3) % 1000000);
    const std::string name = upToNul(input.rest());
    if (!reference::isReasonable(name)) return 0;

    static const Logger logger("a channel");
    LogMsgMetadata facts(&logger, INFO);
    facts.stamp.set(sec, usec);
    const auto expected = reference::date(name.data(), name.size(), sec, usec);
    const LogFormattedDate layout(name.data(), name.size());
    CachedTm tm;
    std::string got;
    bool threw = false;
    try {
        layout.fmt(got, tm, facts);
    } catch (const std::length_error&) {
        threw = true;
    }
    check(threw == !expected, "an empty piece is what throws");
    if (expected) checkSame(got, *expected, name.c_str());
    return 0;
}
