#pragma once

#include <string>
#include <vector>

#include "Options.h"
#include "Status.h"

// One verb of the tool.
struct Command {
    const char* verb;
    const char* arguments;  // as the help shows them
    const char* does;       // in one line of the help
    const char* options;    // those it takes, by their long names; all take what kForAll says
    std::size_t minArguments;
    std::size_t maxArguments;
    bool writes;  // the record file
    Status (*run)(const Options& options, const std::vector<std::string>& arguments);
};

const std::vector<Command>& commands();

// Whether the verb takes the option.
bool takes(const Command& command, const std::string& option);

// The verb's command; null when there is none of that name.
const Command* commandOf(const std::string& verb);
// The same; throws Failure USAGE when there is none, with what was surely meant.
const Command& knownCommand(const std::string& verb);
// The command line's; throws Failure USAGE for an unknown verb, an option that it does not take, or
// a wrong number of arguments.
const Command& findCommand(const Options& options);

// The text that --help shows, and that of one verb.
std::string helpText();
std::string helpText(const Command& command);

// A key, or a beginning of keys, as it was given.
std::string keyOf(const std::string& argument, const Options& options);
std::string prefixOf(const std::vector<std::string>& arguments, const Options& options);
bool beginsWith(const std::string& key, const std::string& prefix);

// The verbs that only read.
Status runList(const Options& options, const std::vector<std::string>& arguments);
Status runGet(const Options& options, const std::vector<std::string>& arguments);
Status runDump(const Options& options, const std::vector<std::string>& arguments);
Status runCheck(const Options& options, const std::vector<std::string>& arguments);
Status runDiff(const Options& options, const std::vector<std::string>& arguments);
Status runStats(const Options& options, const std::vector<std::string>& arguments);
Status runHelp(const Options& options, const std::vector<std::string>& arguments);
// Those that write.
Status runPut(const Options& options, const std::vector<std::string>& arguments);
Status runRemove(const Options& options, const std::vector<std::string>& arguments);
Status runLoad(const Options& options, const std::vector<std::string>& arguments);
Status runBatch(const Options& options, const std::vector<std::string>& arguments);
Status runSalvage(const Options& options, const std::vector<std::string>& arguments);
