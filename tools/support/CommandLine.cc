#include "support/CommandLine.h"

#include <korvex/Version.h>

#include <cstdio>
#include <cstdlib>

#include "support/StandardOutput.h"

CommandLine::CommandLine(const char* name, int argc, const char* const* argv,
                         const poptOption* table, const char* usage)
    : _name(name), _argv(argv, argv + argc) {
    if (_argv.empty()) _argv.push_back(name);
    _argv.push_back(nullptr);
    const int count = static_cast<int>(_argv.size()) - 1;
    _context.reset(poptGetContext(name, count, _argv.data(), table, 0));
    poptSetOtherOptionHelp(get(), usage);
}

std::string CommandLine::argument() const {
    const std::unique_ptr<char, decltype(&std::free)> text(poptGetOptArg(get()), &std::free);
    return text ? text.get() : "";
}

std::string CommandLine::complaint(int code) const {
    return std::string(poptBadOption(get(), POPT_BADOPTION_NOALIAS)) + ": " + poptStrerror(code);
}

// popt's own option for help would not notice when its output is lost.
void CommandLine::showHelp() const {
    poptPrintHelp(get(), stdout, 0);
    finishOutput();
    std::exit(EXIT_SUCCESS);
}

void CommandLine::showVersion() const {
    std::printf("%s %s\n", _name, KORVEX_VERSION_STRING);
    finishOutput();
    std::exit(EXIT_SUCCESS);
}
