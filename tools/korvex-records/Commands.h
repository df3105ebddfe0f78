#pragma once

#include <string>
#include <vector>

#include "Options.h"
#include "Status.h"

// One verb of the tool.
struct Command {
    const char* verb;
    std::size_t minArguments;
    std::size_t maxArguments;
    Status (*run)(const Options& options, const std::vector<std::string>& arguments);
};

// The verb's command; throws Failure USAGE for an unknown verb or a wrong number of arguments.
const Command& findCommand(const Options& options);

// The verbs that only read.
Status runList(const Options& options, const std::vector<std::string>& arguments);
Status runGet(const Options& options, const std::vector<std::string>& arguments);
Status runDump(const Options& options, const std::vector<std::string>& arguments);
Status runCheck(const Options& options, const std::vector<std::string>& arguments);
Status runDiff(const Options& options, const std::vector<std::string>& arguments);
Status runStats(const Options& options, const std::vector<std::string>& arguments);
// Those that write.
Status runPut(const Options& options, const std::vector<std::string>& arguments);
Status runRemove(const Options& options, const std::vector<std::string>& arguments);
Status runLoad(const Options& options, const std::vector<std::string>& arguments);
