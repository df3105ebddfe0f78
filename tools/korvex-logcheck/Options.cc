#include "Options.h"

#include <popt.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

#include "Output.h"
#include "Status.h"

namespace {

struct FreeContext {
    void operator()(poptContext context) const { poptFreeContext(context); }
};
using Context = std::unique_ptr<poptContext_s, FreeContext>;

enum Action { VERSION = 'V', HELP = '?', HOME = 'H', CHANNEL = 'c' };

const poptOption optionTable[] = {
    {"home", '\0', POPT_ARG_STRING, nullptr, HOME, "replaces ${KORVEX_HOME} in file names", "DIR"},
    {"channel", '\0', POPT_ARG_STRING, nullptr, CHANNEL,
     "show where messages of each level of this channel land", "NAME"},
    {"version", '\0', POPT_ARG_NONE, nullptr, VERSION, "show the version", nullptr},
    {"help", '?', POPT_ARG_NONE, nullptr, HELP, "show this text", nullptr},
    {nullptr, '\0', 0, nullptr, 0, nullptr, nullptr},
};

std::string takeText(poptContext context) {
    const std::unique_ptr<char, decltype(&std::free)> text(poptGetOptArg(context), &std::free);
    return text ? text.get() : "";
}

void act(int action, poptContext context, Options& options) {
    if (action == HOME) options.home = takeText(context);
    if (action == CHANNEL) options.channel = takeText(context);
    if (action == HELP) poptPrintHelp(context, stdout, 0);
    if (action == VERSION) std::puts("korvex-logcheck " KORVEX_VERSION);
    if (action != HELP && action != VERSION) return;
    finishOutput();
    std::exit(CLEAN);
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
    std::vector<const char*> arguments(argv, argv + argc);
    if (arguments.empty()) arguments.push_back("korvex-logcheck");
    arguments.push_back(nullptr);
    const Context context(poptGetContext("korvex-logcheck", static_cast<int>(arguments.size()) - 1,
                                         arguments.data(), optionTable, 0));
    poptSetOtherOptionHelp(context.get(), "FILE [--home DIR] [--channel NAME]");
    Options options;
    const char* const home = std::getenv("KORVEX_HOME");
    if (home != nullptr) options.home = home;
    int rc = 0;
    while ((rc = poptGetNextOpt(context.get())) > 0)
        act(rc, context.get(), options);
    if (rc != -1) {
        throw Failure(std::string(poptBadOption(context.get(), POPT_BADOPTION_NOALIAS)) + ": " +
                      poptStrerror(rc));
    }
    // As a program's set-up tidies its home.
    options.home.removeDoubleSeps();
    options.home.removeTrailingSeps();
    options.file = takeFile(context.get());
    return options;
}
