#include "../support/LoggingRows.h"

#include <spdlog/sinks/basic_file_sink.h>
#include <spdlog/sinks/rotating_file_sink.h>
#include <spdlog/spdlog.h>

namespace {

struct Spdlog {
    explicit Spdlog(const bench::Setup& setup) {
        logger = setup.maxSize == 0 ? spdlog::basic_logger_mt(bench::kChannel, setup.file)
                                    : spdlog::rotating_logger_mt(bench::kChannel, setup.file,
                                                                 setup.maxSize, setup.backups);
        logger->set_pattern(setup.layout == bench::Layout::MESSAGE
                                ? "%v"
                                : "%Y-%m-%d %H:%M:%S,%e [%t] %-5l %n: %v");
        logger->flush_on(spdlog::level::info);
    }
    void info(unsigned n, const char* who) { logger->info("request {} from {} answered", n, who); }
    void debug(unsigned n, const char* who) {
        logger->debug("request {} from {} answered", n, who);
    }
    static void configure(const char*) { bench::unsupported(); }
    static void first() {}

    std::shared_ptr<spdlog::logger> logger;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Spdlog>(argc, argv);
}
