#pragma once

#include <string>
#include <vector>

#include "Configuration.h"
#include "Status.h"

// Something to be told about one line of the file.
struct Finding {
    unsigned lineno;
    bool isError;
    std::string text;
};

using Findings = std::vector<Finding>;

// Everything there is to tell, in the order of the lines.
Findings findAll(const Configuration& config);

Status statusOf(const Findings& findings);

// What findAll() is made of; each adds to the findings.
void findErrors(const Configuration& config, Findings& to);
void findInChannels(const Configuration& config, Findings& to);
void findInAppenders(const Configuration& config, Findings& to);
void findInLayouts(const Configuration& config, Findings& to);

inline void warn(Findings& to, unsigned lineno, const std::string& text) {
    to.push_back({lineno, false, text});
}

// Whether the word is a level's name; in any case with `anyCase`.
bool isLevelWord(const std::string& word, bool anyCase = false);
