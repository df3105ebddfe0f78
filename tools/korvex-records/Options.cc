#include "Options.h"

#include <algorithm>
#include <charconv>

#include "Status.h"
#include "Suggestion.h"
#include "support/CommandLine.h"

namespace {

constexpr int kFirst = 1000;  // what popt says for the first one; letters are below

struct Received {
    std::string name;
    std::string argument;
};

std::vector<poptOption> poptTable() {
    std::vector<poptOption> table;
    int number = kFirst;
    for (const OptionText& option : optionTexts()) {
        const unsigned kind = option.argument != nullptr ? POPT_ARG_STRING : POPT_ARG_NONE;
        table.push_back({option.name, option.letter, kind, nullptr, number++, nullptr, nullptr});
    }
    table.push_back({nullptr, '?', POPT_ARG_NONE, nullptr, 'h', nullptr, nullptr});
    table.push_back({nullptr, '\0', 0, nullptr, 0, nullptr, nullptr});
    return table;
}

unsigned secondsOf(const std::string& text) {
    unsigned seconds = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), seconds);
    if (error != std::errc() || end != text.data() + text.size()) {
        throw Failure(USAGE, "--wait: not a number of seconds: \"" + text + "\"");
    }
    return seconds;
}

std::string notEmpty(const Received& option) {
    if (!option.argument.empty()) return option.argument;
    throw Failure(USAGE, "--" + option.name + ": a file's name must not be empty");
}

void setFlag(Options& options, const std::string& name) {
    const struct {
        const char* name;
        bool& flag;
    } kFlags[] = {{"long", options.longList},
                  {"null", options.nulSeparated},
                  {"hex", options.hex},
                  {"print", options.print},
                  {"json", options.json},
                  {"replace", options.replace},
                  {"keep", options.keep},
                  {"dry-run", options.dryRun},
                  {"key-escaped", options.keyEscaped},
                  {"any-version", options.anyVersion},
                  {"create", options.create},
                  {"verbose", options.verbose},
                  {"version", options.version},
                  {"help", options.help}};
    for (const auto& [known, flag] : kFlags)
        if (name == known) flag = true;
}

void accept(Options& options, const Received& option) {
    options.given.push_back(option.name);
    if (option.name == "file") options.file = notEmpty(option);
    if (option.name == "input") options.input = notEmpty(option);
    if (option.name == "output") options.output = notEmpty(option);
    if (option.name == "value") options.value = option.argument;
    if (option.name == "wait") options.wait = secondsOf(option.argument);
    setFlag(options, option.name);
}

std::string unknown(const CommandLine& line, int code) {
    const std::string word = poptBadOption(line.get(), POPT_BADOPTION_NOALIAS);
    std::vector<std::string> names;
    for (const OptionText& option : optionTexts())
        names.push_back(std::string("--") + option.name);
    const bool isUnknown = code == POPT_ERROR_BADOPT;
    return line.complaint(code) + (isUnknown ? didYouMean(word, names) : "");
}

}  // namespace

const std::vector<OptionText>& optionTexts() {
    static const std::vector<OptionText> kTexts = {
        {"file", 'f', "FILE", "use this record file"},
        {"long", 'l', nullptr, "with the values' sizes"},
        {"null", '0', nullptr, "raw keys, each ended by a NUL"},
        {"hex", 'x', nullptr, "the value as hex digits"},
        {"input", 'i', "FILE", "read the value from FILE; - is standard input"},
        {"value", '\0', "TEXT", "the value, whatever it looks like"},
        {"print", 'p', nullptr, "printable characters as they are"},
        {"json", '\0', nullptr, "one JSON object a line"},
        {"replace", '\0', nullptr, "remove what the dump does not hold"},
        {"keep", '\0', nullptr, "leave the keys that are there as they are"},
        {"dry-run", '\0', nullptr, "change nothing, only say what would be"},
        {"output", 'o', "NEWFILE", "write what is whole to this new file"},
        {"key-escaped", '\0', nullptr, "keys are given as list shows them"},
        {"create", '\0', nullptr, "make a missing hashDb directory"},
        {"wait", '\0', "SECONDS", "wait no longer for other runs"},
        {"any-version", '\0', nullptr, "write to a file of another version, too"},
        {"verbose", '\0', nullptr, "say which logging configuration is used"},
        {"version", '\0', nullptr, "show the version"},
        {"help", 'h', nullptr, "show this text, or a verb's"}};
    return kTexts;
}

Options parseOptions(int argc, const char* const* argv) {
    const std::vector<poptOption> table = poptTable();
    const CommandLine line("korvex-records", argc, argv, table.data(), "");
    Options options;
    int rc = 0;
    while ((rc = poptGetNextOpt(line.get())) > 0) {
        if (rc == 'h') options.help = true;
        if (rc < kFirst) continue;
        accept(options,
               {optionTexts()[static_cast<std::size_t>(rc - kFirst)].name, line.argument()});
    }
    if (rc != -1 && !options.help) throw Failure(USAGE, unknown(line, rc));
    if (const char** rest = poptGetArgs(line.get())) {
        while (*rest != nullptr)
            options.words.emplace_back(*rest++);
    }
    return options;
}
