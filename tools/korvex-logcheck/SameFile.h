#pragma once

#include <string>

// One file by one name: normalised, and links followed as far as there are any.
std::string canonicalName(const std::string& name);

// Whether two names are those of one file, by whatever spelling or link. A device is none: it takes
// lines from any number.
bool isSameFile(const std::string& a, const std::string& b);
