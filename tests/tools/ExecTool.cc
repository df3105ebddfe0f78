#include "tools/ExecTool.h"

#include <unistd.h>

#include <cstdlib>

namespace testsupport {

namespace {

const char* emulator() {
    const char* const path = std::getenv("KORVEX_EMULATOR");
    return path != nullptr && *path != '\0' ? path : nullptr;
}

void become(const char* name, const char* path, const std::vector<std::string>& arguments) {
    std::vector<const char*> argv;
    if (isEmulated()) argv.insert(argv.end(), {emulator(), "-0", name, path});
    if (!isEmulated()) argv.push_back(name);
    for (const std::string& one : arguments)
        argv.push_back(one.c_str());
    argv.push_back(nullptr);
    execv(isEmulated() ? emulator() : path, const_cast<char**>(argv.data()));
}

}  // namespace

bool isEmulated() {
    return emulator() != nullptr;
}

void execTool(const std::vector<std::string>& arguments) {
    become("korvex-records", KORVEX_RECORDS, arguments);
}

void execLogcheck(const std::vector<std::string>& arguments) {
    become("korvex-logcheck", KORVEX_LOGCHECK, arguments);
}

}  // namespace testsupport
