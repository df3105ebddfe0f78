#include <algorithm>
#include <set>

#include "Findings.h"
#include "Text.h"

namespace {

bool isAppender(const std::string& word) {
    return !isLevelWord(word) && LogAppender::find(word, false) != nullptr;
}

std::string destinationsOf(const Configuration& config, const Channel& channel) {
    std::vector<std::string> names;
    for (const LogAppender* const one : Configuration::destinations(*channel.made))
        names.push_back(visible(config.nameOf(one)));
    return listed(names);
}

// The words of one value that applies to the channel.
void checkWords(const Configuration& config, const Channel& channel, const std::string& who,
                const ConfigStatement& said, Findings& to) {
    std::set<std::string> seen;
    unsigned levels = 0;
    unsigned unknown = 0;
    unsigned appenders = 0;
    for (const std::string& word : wordsOf(said.value)) {
        if (isLevelWord(word)) {
            ++levels;
        } else if (!isAppender(word)) {
            if (!isLevelWord(word, true)) ++unknown;
        } else {
            ++appenders;
            if (!seen.insert(word).second) {
                warn(to, said.lineno,
                     who + " names " + quoted(word) + " twice and writes each line twice there");
            }
        }
    }
    if (unknown > 0 && appenders == 0) {
        warn(to, said.lineno,
             who + " names no appender that exists: it writes to " +
                 destinationsOf(config, channel));
    }
    if (levels > 1) warn(to, said.lineno, who + " names several levels; the last one counts");
    if (levels + unknown + appenders == 0 && wordsOf(said.value).empty()) {
        warn(to, said.lineno, who + " is given no level and no appender: the line says nothing");
    }
}

void checkRoot(const Configuration& config, Findings& to) {
    const std::vector<ConfigStatement>& lines = config.root.statements;
    if (lines.empty()) return;
    for (auto line = lines.begin(); line + 1 != lines.end(); ++line) {
        warn(to, line->lineno,
             "the root category of this line is replaced by line " +
                 std::to_string(lines.back().lineno));
    }
    checkWords(config, config.root, "the root category", lines.back(), to);
}

void checkName(const Channel& category, Findings& to) {
    const unsigned lineno = category.statements.front().lineno;
    const std::string who = "category " + quoted(category.name);
    if (isLevelWord(category.name, true)) {
        warn(to, lineno, who + " is spelt like a level; the root's level is set by rootCategory");
    }
    if (category.name.empty() || category.name.find_first_of(" \t") != std::string::npos) {
        warn(to, lineno, who + " has an empty name or a blank in it, as no logger is called");
    }
}

}  // namespace

void findInChannels(const Configuration& config, Findings& to) {
    checkRoot(config, to);
    for (const Channel& category : config.categories) {
        checkName(category, to);
        for (const ConfigStatement& said : category.statements) {
            checkWords(config, category, "category " + quoted(category.name), said, to);
            if (&said == &category.statements.front()) continue;
            warn(to, said.lineno,
                 "category " + quoted(category.name) + " has been set before, on line " +
                     std::to_string(category.statements.front().lineno) +
                     "; this line is applied on top");
        }
    }
}
