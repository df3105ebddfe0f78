#include "support/LogFiles.h"

#include <cstdlib>

#include <filesystem>
#include <fstream>
#include <functional>
#include <map>

namespace testsupport {

namespace fs = std::filesystem;

std::vector<std::string> linesOf(const std::string& logFile) {
    // Numbers may be missing: a rotation that was broken off leaves a gap.
    std::map<unsigned long, fs::path, std::greater<>> oldestFirst;
    const std::string name = fs::path(logFile).filename().string();
    for (const auto& entry : fs::directory_iterator(fs::path(logFile).parent_path())) {
        const std::string found = entry.path().filename().string();
        if (found == name) oldestFirst[0] = entry.path();
        if (found.rfind(name + ".", 0) == 0) {
            oldestFirst[std::strtoul(found.c_str() + name.size() + 1, nullptr, 10)] = entry.path();
        }
    }
    std::vector<std::string> lines;
    for (const auto& [number, path] : oldestFirst) {
        std::ifstream in(path, std::ios::binary);
        for (std::string line; std::getline(in, line);)
            lines.push_back(line);
    }
    return lines;
}

}  // namespace testsupport
