#include "../support/LoggingRows.h"

#include <log4cpp/Category.hh>
#include <log4cpp/FileAppender.hh>
#include <log4cpp/PatternLayout.hh>
#include <log4cpp/PropertyConfigurator.hh>
#include <log4cpp/RollingFileAppender.hh>

namespace {

struct Log4cpp {
    explicit Log4cpp(const bench::Setup& setup) {
        auto* const layout = new log4cpp::PatternLayout;
        layout->setConversionPattern(setup.layout == bench::Layout::MESSAGE
                                         ? "%m%n"
                                         : "%d{%Y-%m-%d %H:%M:%S,%l} [%t] %-5p %c: %m%n");
        log4cpp::Appender* appender = nullptr;
        if (setup.maxSize == 0) {
            appender = new log4cpp::FileAppender("A", setup.file);
        } else {
            appender =
                new log4cpp::RollingFileAppender("A", setup.file, setup.maxSize, setup.backups);
        }
        appender->setLayout(layout);
        category.setAdditivity(false);
        category.setAppender(appender);
        category.setPriority(log4cpp::Priority::INFO);
    }
    void info(unsigned n, const char* who) { category.info("request %u from %s answered", n, who); }
    void debug(unsigned n, const char* who) {
        category.debug("request %u from %s answered", n, who);
    }
    static void configure(const char* file) { log4cpp::PropertyConfigurator::configure(file); }
    static void first() {
        log4cpp::Category::getInstance(bench::kChannel)
            .info("request %u from %s answered", 1u, bench::kWho);
    }

    log4cpp::Category& category = log4cpp::Category::getInstance(bench::kChannel);
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Log4cpp>(argc, argv);
}
