#pragma once

#include <string>
#include <string_view>
#include <vector>

// How many characters have to be put in, left out, changed, or swapped with their neighbour to make
// one of the other.
std::size_t distanceOf(std::string_view a, std::string_view b);

// The candidate that the word was surely meant to be: nearest to it, in any case, and near enough.
// Empty without one.
std::string nearestTo(std::string_view word, const std::vector<std::string>& candidates);
