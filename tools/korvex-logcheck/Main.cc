#include <csignal>
#include <cstdio>
#include <exception>

#include "Options.h"
#include "Report.h"
#include "support/StandardOutput.h"

namespace {

Status run(int argc, char** argv) {
    // A reader that is gone is told by the write that fails.
    std::signal(SIGPIPE, SIG_IGN);
    const Options options = parseOptions(argc, argv);
    const Configuration config = Configuration::read(options.file, options.home);
    const Findings findings = findAll(config);
    if (options.channel) {
        reportChannel(config, *options.channel);
    } else {
        reportAll(config);
    }
    reportFindings(options.file, findings);
    finishOutput();
    return statusOf(findings);
}

}  // namespace

int main(int argc, char** argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception& e) {
        std::fprintf(stderr, "korvex-logcheck: %s\n", e.what());
        return ERRORS;
    }
}
