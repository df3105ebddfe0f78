#include <csignal>
#include <cstdio>
#include <exception>

#include "Options.h"
#include "Report.h"
#include "export/Export.h"
#include "support/StandardOutput.h"

namespace {

// What would be exported of a configuration with errors would be a guess.
Status exportOnly(const Options& options, const Configuration& config, const Findings& findings) {
    if (statusOf(findings) == ERRORS) {
        throw Failure(options.file + " has errors; korvex-logcheck shows them without --export");
    }
    exportTo(*options.engine, config, options.file, options.appender);
    finishOutput();
    return CLEAN;
}

Status run(int argc, char** argv) {
    // A reader that is gone is told by the write that fails.
    std::signal(SIGPIPE, SIG_IGN);
    const Options options = parseOptions(argc, argv);
    if (options.engine == "list") {
        listEngines();
        finishOutput();
        return CLEAN;
    }
    const Configuration config = Configuration::read(options.file, options.home);
    const Findings findings = findAll(config);
    if (options.engine) return exportOnly(options, config, findings);
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
