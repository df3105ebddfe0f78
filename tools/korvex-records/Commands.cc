#include "Commands.h"

namespace {

constexpr std::size_t kAny = static_cast<std::size_t>(-1);

constexpr Command kCommands[] = {
    {"list", 0, 1, runList},        {"get", 1, 1, runGet},   {"put", 1, 2, runPut},
    {"remove", 1, kAny, runRemove}, {"dump", 0, 1, runDump}, {"load", 0, 1, runLoad},
    {"check", 0, 0, runCheck},      {"diff", 1, 1, runDiff}, {"stats", 0, 1, runStats},
};

}  // namespace

const Command& findCommand(const Options& options) {
    if (options.words.empty()) throw Failure(USAGE, "no verb; see --help");
    const std::string& verb = options.words.front();
    for (const Command& command : kCommands) {
        if (verb != command.verb) continue;
        const std::size_t count = options.words.size() - 1;
        if (count < command.minArguments || count > command.maxArguments) {
            throw Failure(USAGE, verb + ": wrong number of arguments; see --help");
        }
        return command;
    }
    throw Failure(USAGE, verb + ": unknown verb; see --help");
}
