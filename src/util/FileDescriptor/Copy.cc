#include <korvex/util/FileDescriptor.h>

#include <cerrno>

inline namespace korvex {

namespace {

bool writeWhole(FileDescriptor out, const char* p, unsigned long n) {
    while (n > 0) {
        const int written = out.write(p, n);
        if (written == 0) errno = ENOSPC;
        if (written <= 0) return false;
        p += written;
        n -= static_cast<unsigned long>(written);
    }
    return true;
}

// Emptying the destination would empty the source.
bool isSameFile(FileDescriptor fd, const Pathname& path) {
    const int saved = errno;
    struct stat a {};
    struct stat b {};
    const bool same = fd.stat(&a) && path.stat(&b) && a.st_dev == b.st_dev && a.st_ino == b.st_ino;
    errno = saved;
    return same;
}

}  // namespace

bool FileDescriptor::copyTo(FileDescriptor outfd) const {
    char buf[8192];
    for (;;) {
        const int n = read(buf, sizeof buf);
        if (n <= 0) return n == 0;
        if (!writeWhole(outfd, buf, static_cast<unsigned long>(n))) return false;
    }
}

bool FileDescriptor::copyTo(const Pathname& dest) const {
    if (!valid()) return false;
    if (isSameFile(*this, dest)) {
        errno = EINVAL;
        return false;
    }
    ScopedFileDescriptor out;
    out = dest.openCreateOrReplace(*this);
    return out.valid() && copyTo(static_cast<FileDescriptor>(out));
}

}  // namespace korvex
