// Instants, differences, and durations read from text.
#include <korvex/util/Timeval.h>

#include <cstdio>

static Timeval at(int sec, int usec) {
    Timeval t;
    t.set(sec, usec);
    return t;
}

static void difference(const Timeval& later, const Timeval& earlier) {
    std::printf("%lld ms, \"usec\" %lld, \"%s\"\n", Timeval::msecDifference(later, earlier),
                Timeval::usecDifference(later, earlier),
                Timeval::describeDifference(later, earlier).c_str());
}

static void parse(const char* text) {
    unsigned long long ms = 0;
    unsigned long used = 0;
    const bool ok = convert_string_to_milliseconds(text, &ms, &used);
    std::printf("\"%s\": %s, %llu ms, %lu characters\n", text, ok ? "true" : "false", ms, used);
}

int main() {
    difference(at(10, 500000), at(8, 0));
    difference(at(8, 0), at(10, 500000));
    difference(at(0, 1), at(0, 0));  // a part of a millisecond counts as one
    difference(at(0, 1500), at(0, 0));
    difference(at(9000, 0), at(0, 0));

    Timeval t = at(2147483000, 0);
    t.addSec(1000);  // saturates, never wraps
    std::printf("%d s %d ms\n", t.sec(), t.msec());

    for (const char* const text : {"2", "1.5", ".25", "5.", " 0.0001", "3s", "-1", "1.23449"})
        parse(text);
}
