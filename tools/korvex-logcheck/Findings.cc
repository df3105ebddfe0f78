#include "Findings.h"

#include <strings.h>

#include <algorithm>

bool isLevelWord(const std::string& word, bool anyCase) {
    for (int level = DEBUG; level <= EMERG; ++level) {
        unsigned long length = 0;
        const char* const name = loglevel2str(&length, static_cast<LogLevel>(level));
        if (word == name) return true;
        if (anyCase && strcasecmp(word.c_str(), name) == 0) return true;
    }
    return false;
}

Findings findAll(const Configuration& config) {
    Findings all;
    findErrors(config, all);
    findInChannels(config, all);
    findInAppenders(config, all);
    findInLayouts(config, all);
    std::stable_sort(all.begin(), all.end(),
                     [](const Finding& a, const Finding& b) { return a.lineno < b.lineno; });
    return all;
}

Status statusOf(const Findings& findings) {
    if (findings.empty()) return CLEAN;
    const bool anyError = std::any_of(findings.begin(), findings.end(),
                                      [](const Finding& finding) { return finding.isError; });
    return anyError ? ERRORS : WARNINGS;
}
