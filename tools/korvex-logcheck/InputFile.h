#pragma once

#include <string>

// The bytes of a file, of standard input for "-". Throws Failure when they cannot be read, or are
// too many for a configuration.
std::string readInput(const std::string& name);
