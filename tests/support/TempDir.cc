#include "support/TempDir.h"

#include <cstdlib>

#include <algorithm>
#include <stdexcept>
#include <system_error>

namespace testsupport {

namespace fs = std::filesystem;

TempDir::TempDir() : _path((fs::temp_directory_path() / "korvex-test-XXXXXX").string()) {
    if (mkdtemp(_path.data()) == nullptr) throw std::runtime_error("mkdtemp: " + _path);
}

TempDir::~TempDir() {
    std::error_code ignored;
    fs::remove_all(_path, ignored);
}

std::vector<std::string> TempDir::names() const {
    std::vector<std::string> all;
    for (const auto& entry : fs::directory_iterator(_path)) {
        all.push_back(entry.path().filename().string());
    }
    std::sort(all.begin(), all.end());
    return all;
}

void writeFile(const std::string& path, const std::string& content) {
    std::ofstream(path, std::ios::binary) << content;
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

}  // namespace testsupport
