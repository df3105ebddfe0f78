#include "SameFile.h"

#include <sys/stat.h>

#include <filesystem>

namespace {

bool isRegularOrMissing(const std::string& name) {
    struct stat st {};
    return stat(name.c_str(), &st) != 0 || S_ISREG(st.st_mode);
}

}  // namespace

std::string canonicalName(const std::string& name) {
    std::error_code failed;
    const std::filesystem::path path = std::filesystem::weakly_canonical(name, failed);
    return failed ? std::filesystem::path(name).lexically_normal().string() : path.string();
}

bool isSameFile(const std::string& a, const std::string& b) {
    if (!isRegularOrMissing(a)) return false;
    if (canonicalName(a) == canonicalName(b)) return true;
    struct stat first {};
    struct stat second {};
    return stat(a.c_str(), &first) == 0 && stat(b.c_str(), &second) == 0 &&
           first.st_dev == second.st_dev && first.st_ino == second.st_ino;
}
