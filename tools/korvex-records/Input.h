#pragma once

#include <string>

// All of a file, or of standard input. Throw Failure IO_ERROR.
std::string readInputFile(const std::string& name);
std::string readStandardInput();
