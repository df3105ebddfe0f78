// Its lines have a form of their own, much like the dated one; it cannot write without.
#include "../support/LoggingRows.h"

#include <glog/logging.h>

namespace {

struct Glog {
    explicit Glog(const bench::Setup& setup) {
        if (setup.maxSize != 0 || setup.layout == bench::Layout::MESSAGE ||
            std::string(setup.file) == "/dev/null")
            bench::unsupported();
        FLAGS_logbuflevel = -1;  // every line to the kernel
        FLAGS_timestamp_in_logfile_name = false;
        FLAGS_stderrthreshold = google::GLOG_FATAL;
        google::SetLogDestination(google::GLOG_INFO, setup.file);
        google::SetLogSymlink(google::GLOG_INFO, "");
        google::InitGoogleLogging("bench");
    }
    void info(unsigned n, const char* who) {
        LOG(INFO) << "request " << n << " from " << who << " answered";
    }
    void debug(unsigned n, const char* who) {
        VLOG(1) << "request " << n << " from " << who << " answered";
    }
    static void configure(const char*) { bench::unsupported(); }
    static void first() {}
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Glog>(argc, argv);
}
