#pragma once

#include <string>
#include <vector>

// "; did you mean NAME?" for the name that is nearest to what was typed, or nothing when none is
// near.
std::string didYouMean(const std::string& typed, const std::vector<std::string>& names);
