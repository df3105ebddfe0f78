#include "SameFile.h"

#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>

namespace {

constexpr int kMostLinks = 40;

std::string canonicalName(const std::string& name) {
    std::error_code failed;
    const std::filesystem::path path = std::filesystem::weakly_canonical(name, failed);
    return failed ? std::filesystem::path(name).lexically_normal().string() : path.string();
}

// Links are followed as far as the last component, which stays: a file that is renamed.
std::string entryName(const std::string& name) {
    const std::size_t leaf = name.find_last_of('/') + 1;
    const std::string directory = canonicalName(leaf == 0 ? "." : name.substr(0, leaf));
    return (directory.back() == '/' ? directory : directory + '/') + name.substr(leaf);
}

// What the name leads to, also by links to what is not there yet.
std::string targetOf(std::string name) {
    for (int i = 0; i < kMostLinks; ++i) {
        char target[4096];
        const ssize_t size = readlink(name.c_str(), target, sizeof target);
        if (size <= 0) break;
        const std::string to(target, static_cast<std::size_t>(size));
        name = to.front() == '/' ? to : name.substr(0, name.find_last_of('/') + 1) + to;
    }
    return canonicalName(name);
}

}  // namespace

FileIdentity identityOf(const std::string& name) {
    struct stat st {};
    const bool exists = stat(name.c_str(), &st) == 0;
    return {targetOf(name), entryName(name), exists && !S_ISREG(st.st_mode),
            exists,         st.st_dev,       st.st_ino};
}

bool isSameFile(const FileIdentity& a, const FileIdentity& b) {
    if (a.isDevice || b.isDevice) return false;
    if (a.canonical == b.canonical) return true;
    return a.exists && b.exists && a.device == b.device && a.inode == b.inode;
}
