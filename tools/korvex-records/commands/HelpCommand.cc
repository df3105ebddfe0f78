#include <functional>

#include "commands/Commands.h"
#include "terminal/Output.h"

namespace {

constexpr std::size_t kColumn = 26;

std::string line(const std::string& left, const std::string& right) {
    const std::size_t gap = left.size() + 2 < kColumn ? kColumn - left.size() - 2 : 1;
    return "  " + left + std::string(gap, ' ') + right + "\n";
}

std::string optionLines(const std::function<bool(const std::string&)>& isShown) {
    std::string lines;
    for (const OptionText& option : optionTexts()) {
        if (!isShown(option.name)) continue;
        std::string left = option.letter == '\0' ? "    " : std::string("-") + option.letter + ", ";
        left += std::string("--") + option.name;
        if (option.argument != nullptr) left += std::string("=") + option.argument;
        lines += line(left, option.does);
    }
    return lines;
}

std::string usage(const Command& command) {
    const std::string arguments = command.arguments;
    return command.verb + (arguments.empty() ? "" : " " + arguments);
}

}  // namespace

std::string helpText() {
    std::string text =
        "Usage: korvex-records [OPTION...] VERB [ARGUMENT...]\n"
        "Looks into a record file and changes it: hashDb/data below KORVEX_DB, or the one that\n"
        "--file names. A key or value that begins with a minus sign goes behind --.\n\n"
        "Verbs:\n";
    for (const Command& command : commands())
        text += line(usage(command), command.does);
    return text + "\nOptions (\"help VERB\" tells which ones a verb takes):\n" +
           optionLines([](const std::string&) { return true; });
}

std::string helpText(const Command& command) {
    return "Usage: korvex-records [OPTION...] " + usage(command) + "\n" + command.does +
           "\n\nOptions:\n" +
           optionLines([&command](const std::string& name) { return takes(command, name); });
}

Status runHelp(const Options&, const std::vector<std::string>& arguments) {
    write(arguments.empty() ? helpText() : helpText(knownCommand(arguments.front())));
    return DONE;
}
