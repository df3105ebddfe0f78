#include "../support/LoggingRows.h"

#include <log4cplus/fileappender.h>
#include <log4cplus/initializer.h>
#include <log4cplus/layout.h>
#include <log4cplus/logger.h>
#include <log4cplus/loggingmacros.h>

namespace {

struct Log4cplus {
    explicit Log4cplus(const bench::Setup& setup) {
        using namespace log4cplus;
        SharedAppenderPtr appender;
        if (setup.maxSize == 0) {
            appender = new FileAppender(setup.file, std::ios_base::app, true);
        } else {
            appender = new RollingFileAppender(setup.file, static_cast<long>(setup.maxSize),
                                               static_cast<int>(setup.backups), true);
        }
        appender->setLayout(
            std::make_unique<PatternLayout>(setup.layout == bench::Layout::MESSAGE
                                                ? "%m%n"
                                                : "%D{%Y-%m-%d %H:%M:%S,%q} [%t] %-5p %c: %m%n"));
        logger.addAppender(appender);
        logger.setLogLevel(INFO_LOG_LEVEL);
    }
    void info(unsigned n, const char* who) {
        LOG4CPLUS_INFO_FMT(logger, "request %u from %s answered", n, who);
    }
    void debug(unsigned n, const char* who) {
        LOG4CPLUS_DEBUG_FMT(logger, "request %u from %s answered", n, who);
    }
    static void configure(const char*) { bench::unsupported(); }  // reads another dialect
    static void first() {}

    log4cplus::Initializer initializer;
    log4cplus::Logger logger = log4cplus::Logger::getInstance(bench::kChannel);
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Log4cplus>(argc, argv);
}
