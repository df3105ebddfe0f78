#include "Options.h"

#include <vector>

#include "Status.h"
#include "support/CommandLine.h"

namespace {

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

void act(int action, const CommandLine& line, Options& options) {
    if (action == FILE_NAME) options.file = line.argument();
    if (action == INPUT) options.input = line.argument();
    if (action == HELP) line.showHelp();
    if (action == VERSION) line.showVersion();
}

}  // namespace

Options parseOptions(int argc, const char* const* argv) {
    Received received;
    const std::vector<poptOption> table = optionTable(received);
    const CommandLine line(
        "korvex-records", argc, argv, table.data(),
        "[OPTION...] list|get|put|remove|dump|load|check|diff|stats [ARGUMENT...]");
    Options options;
    int rc = 0;
    while ((rc = poptGetNextOpt(line.get())) > 0)
        act(rc, line, options);
    if (rc != -1) throw Failure(USAGE, line.complaint(rc));
    options.longList = received.longList != 0;
    options.nulSeparated = received.nulSeparated != 0;
    options.hex = received.hex != 0;
    options.print = received.print != 0;
    options.create = received.create != 0;
    options.force = received.force != 0;
    if (const char** rest = poptGetArgs(line.get())) {
        while (*rest != nullptr)
            options.words.emplace_back(*rest++);
    }
    return options;
}
