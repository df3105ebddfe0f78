#pragma once

#include <string>
#include <vector>

namespace testsupport {

// Every line of a log file and its numbered backups, oldest first. A last line without a newline
// counts.
std::vector<std::string> linesOf(const std::string& logFile);

}  // namespace testsupport
