#include "SafeCopy.h"

#include <korvex/util/FileDescriptor.h>

#include <unistd.h>

#include "Progress.h"
#include "Status.h"

namespace {

bool copyWhole(const Pathname& from, const Pathname& to) {
    const ScopedFileDescriptor in(from);
    ScopedFileDescriptor out;
    to.unlink();  // a former run's, or a link that somebody planted: neither is written to
    out = to.openCreateOnly(Pathname::CREATE_PRIVATE);
    return in.valid() && out.valid() && in.copyTo(static_cast<FileDescriptor>(out)) &&
           takeAttributes(from, to) && out.sync() == 0;
}

}  // namespace

bool takeAttributes(const Pathname& from, const Pathname& to) {
    struct stat theirs {};
    struct stat own {};
    if (!from.stat(&theirs) || !to.stat(&own)) return false;
    const bool sameOwner = own.st_uid == theirs.st_uid && own.st_gid == theirs.st_gid;
    return (sameOwner || chown(to.c_str(), theirs.st_uid, theirs.st_gid) == 0) &&
           chmod(to.c_str(), theirs.st_mode & 07777U) == 0;
}

void makeSafeCopy(const Pathname& file, const Pathname& copy) {
    progressStep("copying");
    const Pathname unfinished(copy + ".unfinished");
    if (!copyWhole(file, unfinished) || !unfinished.renameTo(copy)) {
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
