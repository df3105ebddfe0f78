#include "commands/Commands.h"

#include <sstream>

#include "Suggestion.h"
#include "text/Escape.h"

namespace {

constexpr std::size_t kAny = static_cast<std::size_t>(-1);

// What each verb takes besides.
constexpr const char kForAll[] = "file verbose version help";

// What others call them.
constexpr struct {
    const char* word;
    const char* verb;
} kOtherWords[] = {
    {"delete", "remove"},  {"del", "remove"},      {"rm", "remove"},    {"unset", "remove"},
    {"set", "put"},        {"add", "put"},         {"store", "put"},    {"ls", "list"},
    {"keys", "list"},      {"cat", "get"},         {"show", "get"},     {"read", "get"},
    {"export", "dump"},    {"import", "load"},     {"restore", "load"}, {"verify", "check"},
    {"repair", "salvage"}, {"recover", "salvage"}, {"compare", "diff"}};

bool contains(const char* words, const std::string& word) {
    std::istringstream all(words);
    for (std::string one; all >> one;)
        if (one == word) return true;
    return false;
}

std::string suggestion(const std::string& word) {
    for (const auto& other : kOtherWords) {
        if (word == other.word) return std::string("; did you mean ") + other.verb + "?";
    }
    std::vector<std::string> verbs;
    for (const Command& command : commands())
        verbs.emplace_back(command.verb);
    return didYouMean(word, verbs);
}

}  // namespace

const std::vector<Command>& commands() {
    static const std::vector<Command> kCommands = {
        {"list", "[PREFIX]", "the keys", "long null key-escaped", 0, 1, false, runList},
        {"get", "KEY", "a key's value", "hex key-escaped", 1, 1, false, runGet},
        {"put", "KEY VALUE|-", "store a value; - reads it from standard input",
         "input value key-escaped create wait any-version", 1, 2, true, runPut},
        {"remove", "KEY...", "remove records", "key-escaped wait any-version", 1, kAny, true,
         runRemove},
        {"dump", "[PREFIX]", "every record as text", "print json key-escaped", 0, 1, false,
         runDump},
        {"load", "[FILE]", "store every record of a dump, or none",
         "json replace keep dry-run create wait any-version", 0, 1, true, runLoad},
        {"batch", "[FILE]", "do many puts and removes, or none", "create wait any-version", 0, 1,
         true, runBatch},
        {"check", "", "what the file holds, or its first fault", "", 0, 0, false, runCheck},
        {"diff", "FILE", "what differs in another record file", "long", 1, 1, false, runDiff},
        {"stats", "[PREFIX]", "how large keys and values are", "key-escaped", 0, 1, false,
         runStats},
        {"salvage", "", "what is whole in a damaged file", "output any-version", 0, 0, false,
         runSalvage},
        {"help", "[VERB]", "show this text, or a verb's", "", 0, 1, false, runHelp}};
    return kCommands;
}

bool takes(const Command& command, const std::string& option) {
    return contains(kForAll, option) || contains(command.options, option);
}

const Command* commandOf(const std::string& verb) {
    for (const Command& command : commands())
        if (verb == command.verb) return &command;
    return nullptr;
}

const Command& knownCommand(const std::string& verb) {
    const Command* const command = commandOf(verb);
    if (command != nullptr) return *command;
    const std::string meant = suggestion(verb);
    throw Failure(USAGE,
                  escaped(verb) + ": unknown verb" + (meant.empty() ? "; see --help" : meant));
}

const Command& findCommand(const Options& options) {
    if (options.words.empty()) throw Failure(USAGE, "no verb; see --help");
    const std::string& verb = options.words.front();
    const Command& command = knownCommand(verb);
    for (const std::string& option : options.given) {
        if (takes(command, option)) continue;
        throw Failure(USAGE, verb + " takes no --" + option + "; see " + verb + " --help");
    }
    const std::size_t count = options.words.size() - 1;
    if (count < command.minArguments || count > command.maxArguments) {
        throw Failure(USAGE, verb + ": wrong number of arguments; see " + verb + " --help");
    }
    return command;
}

std::string keyOf(const std::string& argument, const Options& options) {
    if (!options.keyEscaped) return argument;
    std::string key;
    if (appendUnescaped(key, argument)) return key;
    throw Failure(USAGE, "\"" + escaped(argument) + "\": a backslash without two hex digits");
}

std::string prefixOf(const std::vector<std::string>& arguments, const Options& options) {
    return arguments.empty() ? "" : keyOf(arguments.front(), options);
}

bool beginsWith(const std::string& key, const std::string& prefix) {
    return key.compare(0, prefix.size(), prefix) == 0;
}
