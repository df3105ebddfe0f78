#include "scenarios/Logging.h"

#include <korvex/util/Logger.h>

#include <algorithm>
#include <fstream>

namespace schedules {

void configure(const std::string& lines) {
    std::ofstream("conf") << lines;
    require(Logger::initialize(Pathname("conf"), Pathname()), "the configuration is not read");
}

std::string compare(const char* what, std::vector<std::string> found,
                    std::vector<std::string> expected) {
    std::sort(found.begin(), found.end());
    std::sort(expected.begin(), expected.end());
    if (found == expected) return "";
    std::string text = std::string(what) + " holds";
    for (const std::string& line : found)
        text += " \"" + line + "\"";
    text += ", not";
    for (const std::string& line : expected)
        text += " \"" + line + "\"";
    return text;
}

unsigned count(const std::string& text, const std::string& in) {
    unsigned n = 0;
    for (std::size_t at = 0; (at = in.find(text, at)) != std::string::npos; at += text.size())
        ++n;
    return n;
}

}  // namespace schedules
