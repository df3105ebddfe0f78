// Prints a row of a table for each layout: a WARN message of the logger "net", 2.5 s after the
// epoch.
#include <korvex/util/Logger.h>

#include <cstdio>

static Logger logger("net");

static void show(const char* pattern) {
    LogMsgMetadata md(&logger, WARN);
    Timeval stamp = epoch_timeval();
    stamp.addMsec(2500);
    md.stamp = stamp;
    std::string line;
    LogFormat(pattern).apply(line, md, "slow peer");
    if (!line.empty() && line.back() == '\n') line.replace(line.size() - 1, 1, "⏎");
    std::printf("| `%s` | `[%s]` |\n", pattern, line.c_str());
}

int main() {
    std::printf("| Pattern | Line, in brackets |\n|---|---|\n");
    for (const char* const pattern :
         {"%m%n",  "%R %p %c %m%n", "%-8p: %m%n", "%t",    "%r",   "%R",     "%p",
          "%5p",   "%-5p",          "%05p",       "%.2p",  "%.2c", "%-6.2c", "%6.4m",
          "%.0m",  "%.m",           "%08r",       "100%%", "%%%m", "%%m",    "%q%m",
          "%c{x}", "%m%d{ISO8601",  "%m%-5",      "%m%",   "%3%m", "%- 5p"}) {
        show(pattern);
    }
}
