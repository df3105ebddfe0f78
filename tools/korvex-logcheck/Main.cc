#include <algorithm>
#include <cstdio>
#include <exception>

#include "FindingsReport.h"
#include "Fix.h"
#include "InputFile.h"
#include "Options.h"
#include "Output.h"
#include "Report.h"
#include "Text.h"
#include "export/Export.h"
#include "support/StandardOutput.h"

namespace {

Wanted wantedBy(const Options& options) {
    Wanted wanted{options.home, {}};
    if (options.paths) wanted.paths = Writer{options.user};
    return wanted;
}

// What the library makes of the file as it is, carriage returns and all.
void report(const Options& options, const std::string& file, const Source& source) {
    const Configuration config = Configuration::read(source.bytes(), options.home);
    if (options.files.size() > 1) write("configuration " + printable(file) + "\n\n", Ink::TITLE);
    if (options.channel) {
        reportChannel(config, *options.channel);
    } else {
        reportAll(config);
    }
}

Status check(const Options& options, const std::string& file) {
    const Source source(readInput(file));
    const Findings findings = findAll(source, wantedBy(options));
    if (options.mode == Options::JSON) {
        writeJson(file, findings);
        return statusOf(findings);
    }
    if (options.mode == Options::REPORT) report(options, file, source);
    writeFindings(file, findings);
    if (options.mode == Options::REPORT) writeSummary(findings);
    return statusOf(findings);
}

// What is left to be mended by hand goes to standard error.
Status fix(const Options& options, const std::string& file) {
    const std::string bytes = mended(readInput(file), options.home);
    writeOutput(bytes);
    finishOutput();
    const Findings left = findAll(Source(bytes), wantedBy(options));
    std::fputs(findingsText(file, left).c_str(), stderr);
    return statusOf(left);
}

// What would be exported of a configuration with errors would be a guess.
void exportOnly(const Options& options) {
    if (options.engine == "list") {
        listEngines();
        return;
    }
    const std::string& file = options.files.front();
    const Source source(readInput(file));
    if (statusOf(findAll(source, wantedBy(options))) == ERRORS) {
        throw Failure(printable(file) + " has errors; korvex-logcheck shows them without --export");
    }
    exportTo(options.engine, Configuration::read(source.bytes(), options.home), Pathname(file),
             options.appender);
}

void complain(const std::exception& e) {
    // An option that there is not is quoted in it as it was given.
    std::fprintf(stderr, "korvex-logcheck: %s\n", printable(e.what()).c_str());
}

// One file that cannot be read does not keep the others from being checked.
Status checkAll(const Options& options) {
    Status status = CLEAN;
    for (const std::string& file : options.files) {
        Status one = ERRORS;
        try {
            one = check(options, file);
        } catch (const Failure& failure) {
            complain(failure);
        }
        status = std::max(status, one);
    }
    return status;
}

Status run(int argc, char** argv) {
    const Options options = parseOptions(argc, argv);
    Status status = CLEAN;
    if (options.mode == Options::CODES) {
        writeCodes();
    } else if (options.mode == Options::EXPORT) {
        exportOnly(options);
    } else if (options.mode == Options::FIX) {
        status = fix(options, options.files.front());
    } else {
        status = checkAll(options);
    }
    finishOutput();
    return status;
}

}  // namespace

int main(int argc, char** argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception& e) {
        complain(e);
        return ERRORS;
    }
}
