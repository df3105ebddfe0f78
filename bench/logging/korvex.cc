#include "../support/LoggingRows.h"

#include <korvex/util/Logger.h>

#include <fstream>

namespace {

Logger logger(bench::kChannel);

struct Korvex {
    explicit Korvex(const bench::Setup& setup) {
        std::ofstream("bench.cfg")
            << "rootCategory=INFO, A\n"
            << "appender.A.fileName=" << setup.file << "\n"
            << "appender.A.maxFileSize=" << setup.maxSize << "\n"
            << "appender.A.maxBackupIndex=" << setup.backups << "\n"
            << "appender.A.layout.ConversionPattern="
            << (setup.layout == bench::Layout::MESSAGE ? "%m%n" : "%d{ISO8601} [%t] %-5p %c: %m%n")
            << "\n";
        configure("bench.cfg");
    }
    void info(unsigned n, const char* who) { logger.info("request %u from %s answered", n, who); }
    void debug(unsigned n, const char* who) { logger.debug("request %u from %s answered", n, who); }

    static void configure(const char* file) {
        if (!Logger::initialize(file, "")) bench::giveUp("korvex: bad configuration");
    }
    static void first() { logger.info("request %u from %s answered", 1u, bench::kWho); }
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Korvex>(argc, argv);
}
