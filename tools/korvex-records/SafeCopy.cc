#include "SafeCopy.h"

#include <korvex/util/FileDescriptor.h>

#include <unistd.h>

#include "Status.h"

namespace {

// Content, mode and, where we may, owner.
bool copyWhole(const Pathname& from, const Pathname& to) {
    const ScopedFileDescriptor in(from);
    ScopedFileDescriptor out;
    out = to.openCreateOrReplace(Pathname::CREATE_PRIVATE);
    struct stat st {};
    if (!in.valid() || !out.valid() || !in.stat(&st)) return false;
    if (fchown(out.osdep(), st.st_uid, st.st_gid) != 0) {  // then it becomes ours
    }
    return fchmod(out.osdep(), st.st_mode & 07777U) == 0 &&
           in.copyTo(static_cast<FileDescriptor>(out)) && out.sync() == 0;
}

bool makeEmpty(const Pathname& path) {
    ScopedFileDescriptor out;
    out = path.openCreateOrReplace(Pathname::CREATE_PRIVATE);
    return out.valid() && out.sync() == 0;
}

}  // namespace

void makeSafeCopy(const Pathname& file, const Pathname& copy) {
    const Pathname unfinished(copy + ".unfinished");
    const bool made = file.exists() ? copyWhole(file, unfinished) : makeEmpty(unfinished);
    if (!made || !unfinished.renameTo(copy)) {
        const std::string why = withErrno("cannot make a copy of " + file);
        unfinished.unlink();
        throw Failure(IO_ERROR, why);
    }
    syncDirectoryOf(copy);
}

void dropSafeCopy(const Pathname& copy) {
    if (!copy.unlink()) throw Failure(IO_ERROR, withErrno("cannot remove " + copy));
    syncDirectoryOf(copy);
}

bool syncFile(const Pathname& file) {
    const ScopedFileDescriptor fd(file);
    return fd.valid() && fd.sync() == 0;
}

void syncDirectoryOf(const Pathname& file) {
    const Pathname parent = file.toParent();
    syncFile(parent.empty() ? Pathname(".") : parent);
}
