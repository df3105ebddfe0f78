#include <korvex/util/Timeval.h>

#include <cstdlib>

#include "Check.h"
#include "Input.h"
#include "reference/Durations.h"

namespace {

void checkParsing(const std::string& text) {
    unsigned long long got = 1;
    unsigned long count = 1;
    const bool right = convert_string_to_milliseconds(text.c_str(), &got, &count);
    const reference::Parsed expected = reference::parseSeconds(text);
    check(right == (expected.count > 0), "whether a duration was read");
    checkSame(std::to_string(got), expected.milliseconds, text.c_str());
    checkSame(std::to_string(count), std::to_string(expected.count), text.c_str());
}

int secondsOf(const reference::Instant& instant) {
    return static_cast<int>(instant.usec / 1000000 - (instant.usec % 1000000 < 0 ? 1 : 0));
}

Timeval timevalOf(const reference::Instant& instant) {
    Timeval value;
    value.set(secondsOf(instant), static_cast<int>(instant.usec - secondsOf(instant) * 1000000LL));
    return value;
}

bool isSame(const Timeval& a, const Timeval& b) {
    return a <= b && b <= a;
}

}  // namespace

// A duration's text, and two instants.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Input input(data, size);
    const auto instant = [&input] {
        const long long sec = static_cast<int>(input.number(4));
        return reference::Instant{sec * 1000000 +
                                  static_cast<long long>(input.number(3) % 1000000)};
    };
    const reference::Instant a = instant();
    const reference::Instant b = instant();
    const std::uint64_t span = input.number(8);
    checkParsing(upToNul(input.rest()));

    const Timeval x = timevalOf(a);
    const Timeval y = timevalOf(b);
    check((x < y) == (a.usec < b.usec), "<");
    check((x <= y) == (a.usec <= b.usec), "<=");
    check(Timeval::msecDifference(x, y) == reference::msecDifference(a, b), "msecDifference");
    check(Timeval::usecDifference(x, y) == reference::usecDifference(a, b), "usecDifference");
    checkSame(Timeval::describeDifference(x, y), reference::describe(a, b), "describeDifference");
    Timeval later = x;
    later.addMsec(span);
    check(isSame(later, timevalOf(reference::plusMsec(a, span))), "addMsec");
    later = x;
    later.addSec(static_cast<unsigned>(span));
    check(isSame(later, timevalOf(reference::plusSec(a, span & 0xFFFFFFFF))), "addSec");
    return 0;
}
