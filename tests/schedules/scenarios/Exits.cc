#include <korvex/util/Logger.h>

#include <cstdlib>

#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// The process exits while other threads log.

namespace schedules {

namespace {

Logger* handlersLogger = nullptr;

void besideLogging() {
    configure(
        "rootCategory=INFO,F,A\nappender.A=File\nappender.A.fileName=log\n"
        "appender.A.layout.ConversionPattern=%d{%Y} %m%n\n"
        "appender.F=File\nappender.F.fileName=/dev/full\n");
    Logger& logger = *new Logger("test");
    handlersLogger = &logger;
    std::atexit([] { handlersLogger->info("handler"); });
    Parallel threads{[&logger] { logger.info("%s", "one"); }};
    logger.info(std::string("two"));
    std::exit(0);
}

// The other thread may not have come to its line; what is there is whole.
std::string checkWhole(const Remains& remains) {
    std::vector<std::string> lines;
    bool one = false;
    for (const std::string& line : Remains::lines(remains.file("log"))) {
        if (line == "2026 one") {
            if (one) return "a line is doubled";
            one = true;
        } else if (count("Error writing to \"/dev/full\"", line) == 0) {
            lines.push_back(line);
        }
    }
    return compare("the log", lines, {"2026 two", "2026 handler"});
}

const Register registered{{"exit-beside-logging", &besideLogging, &checkWhole}};

}  // namespace

}  // namespace schedules
