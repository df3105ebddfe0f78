#pragma once

#include <string>
#include <vector>

// The levels' names, from the lowest on.
const std::vector<std::string>& levelNames();
bool isLevel(const std::string& word);
// The level that is spelt like this in another case; empty without one.
std::string levelInOtherCase(const std::string& word);
// The level that other logging libraries call so, in any case; empty without one.
std::string levelOfOtherName(const std::string& word);
// The lowest level from this one on at which a logger has a method to log; empty beyond FATAL.
std::string firstLoggedLevel(const std::string& level);
