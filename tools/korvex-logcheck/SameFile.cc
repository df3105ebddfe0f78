#include "SameFile.h"

#include <sys/stat.h>

#include <filesystem>

namespace {

std::string canonicalName(const std::string& name) {
    std::error_code failed;
    const std::filesystem::path path = std::filesystem::weakly_canonical(name, failed);
    return failed ? std::filesystem::path(name).lexically_normal().string() : path.string();
}

}  // namespace

FileIdentity identityOf(const std::string& name) {
    struct stat st {};
    const bool exists = stat(name.c_str(), &st) == 0;
    return {canonicalName(name), exists && !S_ISREG(st.st_mode), exists, st.st_dev, st.st_ino};
}

bool isSameFile(const FileIdentity& a, const FileIdentity& b) {
    if (a.isDevice || b.isDevice) return false;
    if (a.canonical == b.canonical) return true;
    return a.exists && b.exists && a.device == b.device && a.inode == b.inode;
}
