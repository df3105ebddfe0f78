#include "Options.h"

#include <algorithm>
#include <cstdlib>

#include "Status.h"
#include "support/CommandLine.h"

namespace {

enum Action {
    VERSION = 'V',
    HELP = '?',
    HOME = 'H',
    CHANNEL = 'c',
    PATHS = 'p',
    USER = 'u',
    FIX = 'f',
    JSON = 'j',
    CODES = 'C',
    QUIET = 'q',
    EXPORT = 'x',
    APPENDER = 'a'
};

const poptOption optionTable[] = {
    {"home", '\0', POPT_ARG_STRING, nullptr, HOME, "replaces ${KORVEX_HOME} in file names", "DIR"},
    {"channel", '\0', POPT_ARG_STRING, nullptr, CHANNEL,
     "show where messages of each level of this channel land", "NAME"},
    {"paths", '\0', POPT_ARG_NONE, nullptr, PATHS, "look whether the log files can be written",
     nullptr},
    {"user", '\0', POPT_ARG_STRING, nullptr, USER, "with --paths: by this user", "NAME"},
    {"fix", '\0', POPT_ARG_NONE, nullptr, FIX,
     "write the file, with all that is surely a slip mended", nullptr},
    {"json", '\0', POPT_ARG_NONE, nullptr, JSON, "show the findings only, as JSON", nullptr},
    {"quiet", 'q', POPT_ARG_NONE, nullptr, QUIET, "show the findings only", nullptr},
    {"codes", '\0', POPT_ARG_NONE, nullptr, CODES, "show what can be found", nullptr},
    {"export", '\0', POPT_ARG_STRING, nullptr, EXPORT,
     "write what this engine needs to read the log files; \"list\" shows the engines", "ENGINE"},
    {"appender", '\0', POPT_ARG_STRING, nullptr, APPENDER,
     "with --export: for the file of this one only", "NAME"},
    {"version", '\0', POPT_ARG_NONE, nullptr, VERSION, "show the version", nullptr},
    {"help", '?', POPT_ARG_NONE, nullptr, HELP, "show this text", nullptr},
    {nullptr, '\0', 0, nullptr, 0, nullptr, nullptr},
};

// Of those that change the whole output, one.
void choose(Options::Mode mode, Options& options) {
    const bool other = options.mode != Options::REPORT && options.mode != mode;
    if (other) throw Failure("one of --fix, --json, --quiet, --codes and --export");
    options.mode = mode;
}

void act(int action, const CommandLine& line, Options& options) {
    if (action == HOME) options.home = line.argument();
    if (action == CHANNEL) options.channel = line.argument();
    if (action == PATHS) options.paths = true;
    if (action == USER) options.user = line.argument();
    if (action == FIX) choose(Options::FIX, options);
    if (action == JSON) choose(Options::JSON, options);
    if (action == QUIET) choose(Options::FINDINGS, options);
    if (action == CODES) choose(Options::CODES, options);
    if (action == EXPORT) {
        choose(Options::EXPORT, options);
        options.engine = line.argument();
    }
    if (action == APPENDER) options.appender = line.argument();
    if (action == HELP) line.showHelp();
    if (action == VERSION) line.showVersion();
}

void check(const Options& options) {
    if (options.user && !options.paths) throw Failure("--user goes with --paths");
    if (options.channel && options.mode != Options::REPORT) {
        throw Failure("--channel does not go with --fix, --json, --quiet, --codes and --export");
    }
    if (options.appender && options.mode != Options::EXPORT) {
        throw Failure("--appender goes with --export");
    }
    const bool listsOnly = options.mode == Options::EXPORT && options.engine == "list";
    if (options.mode == Options::CODES || listsOnly) {
        if (!options.files.empty()) {
            throw Failure(listsOnly ? "--export list takes no file" : "--codes takes no file");
        }
        return;
    }
    if (options.files.empty()) throw Failure("no configuration file given; see --help");
    if (std::count(options.files.begin(), options.files.end(), "-") > 1) {
        throw Failure("standard input can be read once only");
    }
    const bool takesOne = options.mode == Options::FIX || options.mode == Options::EXPORT;
    if (takesOne && options.files.size() > 1) {
        throw Failure(options.mode == Options::FIX ? "--fix takes one file at a time"
                                                   : "--export takes one file at a time");
    }
}

}  // namespace

Options parseOptions(int argc, const char* const* argv) {
    const CommandLine line("korvex-logcheck", argc, argv, optionTable, "[OPTION...] FILE...");
    Options options;
    const char* const home = std::getenv("KORVEX_HOME");
    if (home != nullptr) options.home = home;
    int rc = 0;
    while ((rc = poptGetNextOpt(line.get())) > 0)
        act(rc, line, options);
    if (rc != -1) throw Failure(line.complaint(rc));
    // As a program's set-up tidies its home.
    options.home.removeDoubleSeps();
    options.home.removeTrailingSeps();
    while (const char* const file = poptGetArg(line.get()))
        options.files.emplace_back(file);
    check(options);
    return options;
}
