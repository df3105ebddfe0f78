#include "crash-states/RealDirectory.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <stdexcept>
#include <vector>

#include "support/TempDir.h"

namespace crashstates {

namespace {

namespace fs = std::filesystem;

constexpr char kMode[] = "mode";
constexpr char kOwner[] = "owner";

[[noreturn]] void fail(const std::string& what) {
    throw std::runtime_error(what + ": " + std::strerror(errno));
}

struct stat statOf(const std::string& path) {
    struct stat st {};
    if (stat(path.c_str(), &st) != 0) fail("stat " + path);
    return st;
}

std::string octal(mode_t mode) {
    std::string digits;
    for (int shift = 9; shift >= 0; shift -= 3)
        digits += static_cast<char>('0' + ((mode >> shift) & 7U));
    return digits;
}

// None where the file system has no extended attributes.
std::vector<std::string> extendedAttributeNames(const std::string& path) {
    std::vector<char> list(65536);  // the most that Linux hands out
    const ssize_t size = listxattr(path.c_str(), list.data(), list.size());
    if (size < 0 && errno != ENOTSUP) fail("listxattr " + path);
    std::vector<std::string> names;
    for (const char* at = list.data(); at < list.data() + size; at += names.back().size() + 1)
        names.emplace_back(at);
    return names;
}

std::string extendedAttribute(const std::string& path, const std::string& name) {
    std::vector<char> value(65536);
    const ssize_t size = getxattr(path.c_str(), name.c_str(), value.data(), value.size());
    if (size < 0) fail("getxattr " + path);
    return {value.data(), static_cast<std::size_t>(size)};
}

void makeFile(const File& file, const std::string& path) {
    testsupport::writeFile(path, file.bytes);
    for (const auto& [name, value] : file.attributes) {
        if (name == kMode) {
            const auto mode = static_cast<mode_t>(std::stoul(value, nullptr, 8));
            if (chmod(path.c_str(), mode) != 0) fail("chmod " + path);
        } else if (name != kOwner) {
            if (setxattr(path.c_str(), name.c_str(), value.data(), value.size(), 0) != 0) {
                fail("setxattr " + path);
            }
        }
    }
}

}  // namespace

FileId fileIdOf(const std::string& path) {
    const struct stat st = statOf(path);
    return {st.st_dev, st.st_ino};
}

std::string bytesOf(const std::string& path) {
    if (access(path.c_str(), R_OK) != 0) fail("read " + path);
    return testsupport::readFile(path);
}

Attributes attributesOf(const std::string& path) {
    const struct stat st = statOf(path);
    Attributes attributes{{kMode, octal(st.st_mode)},
                          {kOwner, std::to_string(st.st_uid) + ":" + std::to_string(st.st_gid)}};
    for (const std::string& name : extendedAttributeNames(path))
        attributes[name] = extendedAttribute(path, name);
    return attributes;
}

Directory readDirectory(const std::string& path,
                        const std::function<Inode(const FileId&)>& numberOf) {
    Directory directory;
    for (const auto& entry : fs::directory_iterator(path)) {
        const std::string file = entry.path().string();
        if (!fs::is_regular_file(entry.symlink_status())) {
            throw std::runtime_error(file + " is not a regular file");
        }
        const Inode inode = numberOf(fileIdOf(file));
        directory.names[entry.path().filename().string()] = inode;
        directory.files[inode] = {bytesOf(file), attributesOf(file)};
    }
    return directory;
}

void makeDirectory(const State& state, const std::string& path) {
    for (const auto& entry : fs::directory_iterator(path))
        fs::remove(entry.path());
    std::map<Inode, std::string> made;
    for (const auto& [name, entry] : state.names) {
        const std::string file = path + "/" + name;
        const auto [at, isNew] = made.try_emplace(entry.inode, file);
        if (isNew) {
            makeFile(*entry.file, file);
        } else {
            fs::create_hard_link(at->second, file);
        }
    }
}

}  // namespace crashstates
