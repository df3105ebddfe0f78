#include "support/LogFiles.h"

#include <unistd.h>

#include <fstream>

namespace testsupport {

namespace {

void appendLines(std::vector<std::string>& lines, const std::string& file) {
    std::ifstream in(file, std::ios::binary);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
}

}  // namespace

std::vector<std::string> linesOf(const std::string& logFile) {
    unsigned backups = 0;
    while (access((logFile + "." + std::to_string(backups + 1)).c_str(), F_OK) == 0)
        ++backups;
    std::vector<std::string> lines;
    for (unsigned k = backups; k > 0; --k)
        appendLines(lines, logFile + "." + std::to_string(k));
    appendLines(lines, logFile);
    return lines;
}

}  // namespace testsupport
