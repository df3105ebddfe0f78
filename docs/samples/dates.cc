// Prints a row of a table for each date layout, for one instant of the local time zone.
#include <korvex/util/Logger.h>

#include <cstdio>

static Logger logger("net");

static void show(const char* pattern) {
    LogMsgMetadata md(&logger, WARN);
    Timeval stamp;
    stamp.set(1173103389, 7999);  // 2007-03-05 14:03:09.007999 UTC
    md.stamp = stamp;
    std::string line;
    LogFormat(pattern).apply(line, md, "");
    std::printf("| `%s` | `%s` |\n", pattern, line.c_str());
}

int main() {
    std::printf("| Pattern | Result |\n|---|---|\n");
    for (const char* const pattern :
         {"%d", "%d{}", "%d{ISO8601}", "%d{DATE}", "%d{ABSOLUTE}", "%d{%H:%M:%S.%l}",
          "%d{%Y-%m-%dT%H:%M:%S%z}", "%d{%s.%l}", "%d{%a %d %B, week %V}", "%.10d", "%-26dx",
          "%d{date}", "%d{iso8601}", "%d{%l}", "%d{%%l}"}) {
        show(pattern);
    }
}
