#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include "file/NewFile.h"
#include "file/NewFileName.h"

namespace {

bool isSameFile(const struct stat& a, const struct stat& b) {
    return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

// Nothing, or the beginning of a record file.
bool beginsAsOurs(int fd) {
    const std::string start = std::string("\x14\0\0\0", 4) + std::string(kVersionKey) +
                              std::string("\x03\0\0\0", 4) + std::string(kVersion);
    char bytes[64];
    const ssize_t got = pread(fd, bytes, start.size(), 0);
    return got >= 0 && start.compare(0, static_cast<std::size_t>(got), bytes,
                                     static_cast<std::size_t>(got)) == 0;
}

// Whoever makes such a file has it locked.
bool isLeft(const Pathname& file, const struct stat& seen) {
    const ScopedFileDescriptor fd(
        FileDescriptor(::open(file.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC)));
    struct stat opened {};
    return fd.valid() && fd.stat(&opened) && isSameFile(opened, seen) && beginsAsOurs(fd.osdep()) &&
           flock(fd.osdep(), LOCK_EX | LOCK_NB) == 0 && file.unlink();
}

}  // namespace

void sweep(const Pathname& directory, const OpenFile* recordFile) {
    DirectoryDescriptor entries(directory);
    DirectoryEntry entry;
    while (entries.next(entry)) {
        if (!isNewFileName(entry.name())) continue;
        const Pathname file = directory / entry;
        struct stat st {};
        if (lstat(file.c_str(), &st) != 0 || !S_ISREG(st.st_mode)) continue;
        if (recordFile != nullptr && isSameFile(st, recordFile->stat())) {
            file.unlink();  // its maker was killed between linking it and removing this name
        } else if (st.st_uid == geteuid() && st.st_nlink == 1) {
            isLeft(file, st);
        }
    }
}
