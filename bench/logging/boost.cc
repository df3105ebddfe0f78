#include "../support/LoggingRows.h"

#include <boost/log/attributes.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions.hpp>
#include <boost/log/sinks.hpp>
#include <boost/log/sources/record_ostream.hpp>
#include <boost/log/sources/severity_channel_logger.hpp>
#include <boost/log/support/date_time.hpp>
#include <boost/log/trivial.hpp>
#include <boost/log/utility/setup/common_attributes.hpp>
#include <boost/smart_ptr/make_shared.hpp>

#include <fstream>

namespace {

namespace logging = boost::log;
namespace expr = boost::log::expressions;
namespace keywords = boost::log::keywords;
using Level = logging::trivial::severity_level;

boost::shared_ptr<logging::sinks::sink> rotating(const bench::Setup& setup,
                                                 const logging::formatter& layout) {
    auto backend = boost::make_shared<logging::sinks::text_file_backend>(
        keywords::file_name = setup.file, keywords::target_file_name = "bench.log.%N",
        keywords::rotation_size = setup.maxSize, keywords::auto_flush = true);
    backend->set_file_collector(logging::sinks::file::make_collector(
        keywords::target = "backups", keywords::max_files = setup.backups));
    using Sink = logging::sinks::synchronous_sink<logging::sinks::text_file_backend>;
    const auto sink = boost::make_shared<Sink>(backend);
    sink->set_formatter(layout);
    return sink;
}

boost::shared_ptr<logging::sinks::sink> plain(const bench::Setup& setup,
                                              const logging::formatter& layout) {
    auto backend = boost::make_shared<logging::sinks::text_ostream_backend>();
    backend->add_stream(boost::make_shared<std::ofstream>(setup.file, std::ios::app));
    backend->auto_flush(true);
    using Sink = logging::sinks::synchronous_sink<logging::sinks::text_ostream_backend>;
    const auto sink = boost::make_shared<Sink>(backend);
    sink->set_formatter(layout);
    return sink;
}

logging::formatter layoutOf(const bench::Setup& setup) {
    if (setup.layout == bench::Layout::MESSAGE) return expr::stream << expr::smessage;
    const auto date =
        expr::format_date_time<boost::posix_time::ptime>("TimeStamp", "%Y-%m-%d %H:%M:%S,%f");
    return expr::stream << date << " ["
                        << expr::attr<logging::attributes::current_thread_id::value_type>(
                               "ThreadID")
                        << "] " << expr::attr<Level>("Severity") << ' '
                        << expr::attr<std::string>("Channel") << ": " << expr::smessage;
}

struct Boost {
    explicit Boost(const bench::Setup& setup) {
        const logging::formatter layout = layoutOf(setup);
        const auto core = logging::core::get();
        core->add_sink(setup.maxSize == 0 ? plain(setup, layout) : rotating(setup, layout));
        core->set_filter(expr::attr<Level>("Severity") >= Level::info);
        logging::add_common_attributes();
    }
    void info(unsigned n, const char* who) {
        BOOST_LOG_SEV(logger, Level::info) << "request " << n << " from " << who << " answered";
    }
    void debug(unsigned n, const char* who) {
        BOOST_LOG_SEV(logger, Level::debug) << "request " << n << " from " << who << " answered";
    }
    static void configure(const char*) { bench::unsupported(); }
    static void first() {}

    logging::sources::severity_channel_logger_mt<Level> logger{keywords::channel =
                                                                   std::string(bench::kChannel)};
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Boost>(argc, argv);
}
