#include "file/Attributes.h"

#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <map>
#include <string>

namespace {

[[noreturn]] void refuse(const OpenFile& old, const std::string& what) {
    throw Failure(IO_ERROR, withErrno("cannot keep " + what + " of " + old.name()));
}

// Calls with a larger buffer until it fits; false when the call fails otherwise.
template <class Call>
bool readAll(std::string& bytes, Call call) {
    for (bytes.resize(256);; bytes.resize(2 * bytes.size())) {
        const ssize_t got = call(bytes.data(), bytes.size());
        if (got >= 0) bytes.resize(static_cast<std::size_t>(got));
        if (got >= 0) return true;
        if (errno != ERANGE) return false;
    }
}

using Attributes = std::map<std::string, std::string>;

// The file system may know none at all.
Attributes attributesOf(const OpenFile& old, int fd) {
    std::string names;
    if (!readAll(names, [fd](char* to, std::size_t n) { return flistxattr(fd, to, n); })) {
        if (errno == ENOTSUP) return {};
        refuse(old, "the extended attributes");
    }
    Attributes all;
    for (std::size_t at = 0; at < names.size(); at = names.find('\0', at) + 1) {
        const char* const name = names.c_str() + at;
        if (!readAll(all[name],
                     [&](char* to, std::size_t n) { return fgetxattr(fd, name, to, n); })) {
            refuse(old, std::string("the attribute ") + name);
        }
    }
    return all;
}

// What the directory gave the new file (a default access control list) goes, too.
void keepExtended(const OpenFile& old, int to) {
    const Attributes wanted = attributesOf(old, old.fd());
    const Attributes given = attributesOf(old, to);
    for (const auto& [name, value] : given) {
        if (wanted.count(name) == 0 && fremovexattr(to, name.c_str()) != 0) {
            refuse(old, "the absence of the attribute " + name);
        }
    }
    for (const auto& [name, value] : wanted) {
        const auto present = given.find(name);
        if (present != given.end() && present->second == value) continue;
        if (fsetxattr(to, name.c_str(), value.data(), value.size(), 0) != 0) {
            refuse(old, "the attribute " + name);
        }
    }
}

}  // namespace

void keepAttributes(const OpenFile& old, int to) {
    const struct stat& wanted = old.stat();
    struct stat st {};
    if (fstat(to, &st) != 0) refuse(old, "the owner");
    const bool sameOwner = st.st_uid == wanted.st_uid && st.st_gid == wanted.st_gid;
    if (!sameOwner && fchown(to, wanted.st_uid, wanted.st_gid) != 0) refuse(old, "the owner");
    keepExtended(old, to);
    const mode_t mode = wanted.st_mode & 07777U;
    if (fchmod(to, mode) != 0 || fstat(to, &st) != 0) refuse(old, "the mode");
    errno = EPERM;  // the system may leave out some bits without a word
    if ((st.st_mode & 07777U) != mode) refuse(old, "the mode");
}
