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

enum Action { VERSION = 'V', HELP = '?', FILE_NAME = 'f', INPUT = 'i' };

struct Received {
    int longList = 0;
    int nulSeparated = 0;
    int hex = 0;
    int print = 0;
    int create = 0;
    int force = 0;
};

std::vector<poptOption> optionTable(Received& to) {
    return {
        {"file", 'f', POPT_ARG_STRING, nullptr, FILE_NAME, "use this record file", "FILE"},
        {"long", 'l', POPT_ARG_NONE, &to.longList, 0, "list, diff: with the values' sizes",
         nullptr},
        {"null", '0', POPT_ARG_NONE, &to.nulSeparated, 0, "list: raw keys, each ended by a NUL",
         nullptr},
        {"hex", 'x', POPT_ARG_NONE, &to.hex, 0, "get: the value as hex digits", nullptr},
        {"print", 'p', POPT_ARG_NONE, &to.print, 0, "dump: printable characters as they are",
         nullptr},
        {"input", 'i', POPT_ARG_STRING, nullptr, INPUT, "put: read the value from FILE", "FILE"},
        {"create", '\0', POPT_ARG_NONE, &to.create, 0, "make a missing hashDb directory", nullptr},
        {"force", '\0', POPT_ARG_NONE, &to.force, 0, "write to a damaged record file all the same",
         nullptr},
        {"version", '\0', POPT_ARG_NONE, nullptr, VERSION, "show the version", nullptr},
        {"help", '?', POPT_ARG_NONE, nullptr, HELP, "show this text", nullptr},
        {nullptr, '\0', 0, nullptr, 0, nullptr, nullptr},
    };
}

std::string takeText(poptContext context) {
    const std::unique_ptr<char, decltype(&std::free)> text(poptGetOptArg(context), &std::free);
    return text ? text.get() : "";
}

void act(int action, poptContext context, Options& options) {
    if (action == FILE_NAME) options.file = takeText(context);
    if (action == INPUT) options.input = takeText(context);
    // popt's own help would not notice when its output is lost.
    if (action == HELP) poptPrintHelp(context, stdout, 0);
    if (action == VERSION) std::puts("korvex-records " KORVEX_VERSION);
    if (action != HELP && action != VERSION) return;
    finishOutput();
    std::exit(DONE);
}

}  // namespace

Options parseOptions(int argc, const char* const* argv) {
    Received received;
    const std::vector<poptOption> table = optionTable(received);
    std::vector<const char*> arguments(argv, argv + argc);
    if (arguments.empty()) arguments.push_back("korvex-records");
    arguments.push_back(nullptr);
    const Context context(poptGetContext("korvex-records", static_cast<int>(arguments.size()) - 1,
                                         arguments.data(), table.data(), 0));
    poptSetOtherOptionHelp(
        context.get(), "[OPTION...] list|get|put|remove|dump|load|check|diff|stats [ARGUMENT...]");
    Options options;
    int rc = 0;
    while ((rc = poptGetNextOpt(context.get())) > 0)
        act(rc, context.get(), options);
    if (rc != -1) {
        throw Failure(USAGE, std::string(poptBadOption(context.get(), POPT_BADOPTION_NOALIAS)) +
                                 ": " + poptStrerror(rc));
    }
    options.longList = received.longList != 0;
    options.nulSeparated = received.nulSeparated != 0;
    options.hex = received.hex != 0;
    options.print = received.print != 0;
    options.create = received.create != 0;
    options.force = received.force != 0;
    if (const char** rest = poptGetArgs(context.get())) {
        while (*rest != nullptr)
            options.words.emplace_back(*rest++);
    }
    return options;
}
