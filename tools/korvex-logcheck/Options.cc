#include "Options.h"

#include <cstdlib>

#include "Status.h"
#include "support/CommandLine.h"

namespace {

enum Action { VERSION = 'V', HELP = '?', HOME = 'H', CHANNEL = 'c', EXPORT = 'x', APPENDER = 'a' };

const poptOption optionTable[] = {
    {"home", '\0', POPT_ARG_STRING, nullptr, HOME, "replaces ${KORVEX_HOME} in file names", "DIR"},
    {"channel", '\0', POPT_ARG_STRING, nullptr, CHANNEL,
     "show where messages of each level of this channel land", "NAME"},
    {"export", '\0', POPT_ARG_STRING, nullptr, EXPORT,
     "write what this engine needs to read the log files; \"list\" shows the engines", "ENGINE"},
    {"appender", '\0', POPT_ARG_STRING, nullptr, APPENDER, "export the file of this one only",
     "NAME"},
    {"version", '\0', POPT_ARG_NONE, nullptr, VERSION, "show the version", nullptr},
    {"help", '?', POPT_ARG_NONE, nullptr, HELP, "show this text", nullptr},
    {nullptr, '\0', 0, nullptr, 0, nullptr, nullptr},
};

void act(int action, const CommandLine& line, Options& options) {
    if (action == HOME) options.home = line.argument();
    if (action == CHANNEL) options.channel = line.argument();
    if (action == EXPORT) options.engine = line.argument();
    if (action == APPENDER) options.appender = line.argument();
    if (action == HELP) line.showHelp();
    if (action == VERSION) line.showVersion();
}

Pathname takeFile(poptContext context) {
    const char* const file = poptGetArg(context);
    if (file == nullptr) throw Failure("no configuration file given; see --help");
    const char* const more = poptGetArg(context);
    if (more != nullptr) throw Failure(std::string("one file at a time: ") + more);
    return Pathname(file);
}

}  // namespace

Options parseOptions(int argc, const char* const* argv) {
    const CommandLine line("korvex-logcheck", argc, argv, optionTable,
                           "FILE [--home DIR] [--channel NAME] [--export ENGINE]");
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
    if (options.engine != "list") options.file = takeFile(line.get());
    return options;
}
