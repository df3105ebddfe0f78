#include "tools/ExecTool.h"

#include <unistd.h>

#include <cstdlib>

namespace testsupport {

namespace {

const char* emulator() {
    const char* const path = std::getenv("KORVEX_EMULATOR");
    return path != nullptr && *path != '\0' ? path : nullptr;
}

}  // namespace

bool isEmulated() {
    return emulator() != nullptr;
}

void execProgram(const std::string& path, const std::vector<std::string>& arguments) {
    const std::string name = path.substr(path.rfind('/') + 1);
    std::vector<const char*> argv;
    if (isEmulated()) argv.insert(argv.end(), {emulator(), "-0", name.c_str(), path.c_str()});
    if (!isEmulated()) argv.push_back(name.c_str());
    for (const std::string& one : arguments)
        argv.push_back(one.c_str());
    argv.push_back(nullptr);
    execv(isEmulated() ? emulator() : path.c_str(), const_cast<char**>(argv.data()));
}

void execTool(const std::vector<std::string>& arguments) {
    execProgram(KORVEX_RECORDS, arguments);
}

void execLogcheck(const std::vector<std::string>& arguments) {
    execProgram(KORVEX_LOGCHECK, arguments);
}

}  // namespace testsupport
