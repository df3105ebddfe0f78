#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include "base/Assert.h"

#include <sys/types.h>
#include <unistd.h>

#include <cerrno>

inline namespace korvex {

namespace {

bool isOfType(const Pathname& path, mode_t type) {
    struct stat st {};
    return path.stat(&st) && (st.st_mode & S_IFMT) == type;
}

mode_t permissions(Pathname::MkdirMode mode) {
    if (mode == Pathname::MKDIR_PUBLIC) return 0777;
    if (mode == Pathname::MKDIR_WORLD_READ) return 0755;
    if (mode == Pathname::MKDIR_GROUP_RW) return 0770;
    KORVEX_ASSERT_AS(mode == Pathname::MKDIR_PRIVATE, "mode == MKDIR_PRIVATE");
    return 0700;
}

}  // namespace

bool Pathname::stat(struct stat* st) const {
    return ::stat(c_str(), st) == 0;
}

bool Pathname::isDir() const {
    return isOfType(*this, S_IFDIR);
}

bool Pathname::isReg() const {
    return isOfType(*this, S_IFREG);
}

bool Pathname::getMtime(time_t* t) const {
    struct stat st {};
    if (!stat(&st)) return false;
    *t = st.st_mtime;
    return true;
}

bool Pathname::getSize(long long* n) const {
    struct stat st {};
    if (!stat(&st)) return false;
    *n = st.st_size;
    return true;
}

bool Pathname::exists() const {
    return ::access(c_str(), F_OK) == 0;
}

bool Pathname::r_ok() const {
    return ::access(c_str(), R_OK) == 0;
}

bool Pathname::w_ok() const {
    return ::access(c_str(), W_OK) == 0;
}

bool Pathname::rw_ok() const {
    return ::access(c_str(), R_OK | W_OK) == 0;
}

bool Pathname::mkdir(MkdirMode mode) const {
    return ::mkdir(c_str(), permissions(mode)) == 0;
}

bool Pathname::rmdir() const {
    return ::rmdir(c_str()) == 0;
}

bool Pathname::unlink() const {
    return ::unlink(c_str()) == 0;
}

bool Pathname::remove() const {
    return std::remove(c_str()) == 0;
}

bool Pathname::truncate(long long length) const {
    const off_t off = static_cast<off_t>(length);
    if (off != length) {
        errno = EFBIG;
        return false;
    }
    return ::truncate(c_str(), off) == 0;
}

bool Pathname::readlink(char* buf, unsigned long size) const {
    return ::readlink(c_str(), buf, size) == 0;
}

bool Pathname::symlinkTo(const Pathname& link) const {
    return ::symlink(c_str(), link.c_str()) == 0;
}

bool Pathname::renameTo(const Pathname& to) const {
    return ::rename(c_str(), to.c_str()) == 0;
}

bool Pathname::copyTo(const Pathname& to) const {
    const ScopedFileDescriptor from(*this);
    return from.valid() && from.copyTo(to);
}

std::FILE* Pathname::fopen(const char* mode) const {
    return std::fopen(c_str(), mode);
}

DirectoryDescriptor Pathname::opendir() const {
    return DirectoryDescriptor(*this);
}

}  // namespace korvex
