#include "findings/Levels.h"

#include <korvex/util/Logger.h>

#include <algorithm>
#include <utility>

#include "Text.h"

const std::vector<std::string>& levelNames() {
    static const std::vector<std::string> names = [] {
        std::vector<std::string> all;
        for (int level = DEBUG; level <= EMERG; ++level) {
            unsigned long length = 0;
            all.emplace_back(loglevel2str(&length, static_cast<LogLevel>(level)));
        }
        return all;
    }();
    return names;
}

bool isLevel(const std::string& word) {
    return std::count(levelNames().begin(), levelNames().end(), word) > 0;
}

std::string levelInOtherCase(const std::string& word) {
    if (isLevel(word)) return "";
    for (const std::string& level : levelNames()) {
        if (lowered(level) == lowered(word)) return level;
    }
    return "";
}

std::string levelOfOtherName(const std::string& word) {
    static constexpr std::pair<const char*, const char*> kNames[] = {
        {"all", "DEBUG"},     {"trace", "DEBUG"},        {"verbose", "DEBUG"},
        {"fine", "DEBUG"},    {"finer", "DEBUG"},        {"finest", "DEBUG"},
        {"dbg", "DEBUG"},     {"informational", "INFO"}, {"information", "INFO"},
        {"warning", "WARN"},  {"warnings", "WARN"},      {"wrn", "WARN"},
        {"err", "ERROR"},     {"errors", "ERROR"},       {"severe", "ERROR"},
        {"critical", "CRIT"}, {"emergency", "EMERG"},    {"panic", "EMERG"},
        {"off", "EMERG"},     {"none", "EMERG"},         {"disabled", "EMERG"},
        {"silent", "EMERG"},
    };
    const std::string low = lowered(word);
    for (const auto& [name, level] : kNames) {
        if (low == name) return level;
    }
    return "";
}

std::string firstLoggedLevel(const std::string& level) {
    static const std::vector<std::string> kLogged = {"DEBUG", "INFO", "WARN",
                                                     "ERROR", "CRIT", "FATAL"};
    auto at = std::find(levelNames().begin(), levelNames().end(), level);
    for (; at != levelNames().end(); ++at) {
        if (std::count(kLogged.begin(), kLogged.end(), *at) > 0) return *at;
    }
    return "";
}
