#include "points/Files.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <functional>
#include <string_view>

#include "points/Wrap.h"

// System calls on files. The order of two on the same file, or on the same path, matters.

namespace schedules {

// By its path, because inode numbers are not the same in every run.
const void* fileOf(int fd) {
    char link[40];
    char path[4096];
    std::snprintf(link, sizeof link, "/proc/self/fd/%d", fd);
    const ssize_t length = readlink(link, path, sizeof path - 1);
    path[std::max<ssize_t>(length, 0)] = '\0';
    return pathOf(path);
}

const void* pathOf(const char* path) {
    return reinterpret_cast<const void*>(std::hash<std::string_view>()(path) | 1);
}

}  // namespace schedules

using schedules::announce;
using schedules::fileOf;
using schedules::Operation;
using schedules::pathOf;

SCHEDULES_REAL(ssize_t, write, (int, const void*, size_t));
SCHEDULES_REAL(int, open, (const char*, int, ...));
SCHEDULES_REAL(int, rename, (const char*, const char*));
SCHEDULES_REAL(int, unlink, (const char*));
SCHEDULES_REAL(int, stat, (const char*, struct stat*));
SCHEDULES_REAL(int, access, (const char*, int));
SCHEDULES_REAL(int, close, (int));

SCHEDULES_WRAP(ssize_t, write, (int fd, const void* data, size_t size)) {
    announce("write", fileOf(fd), SCHEDULES_CALLER);
    return __real_write(fd, data, size);
}

SCHEDULES_WRAP(int, open, (const char* path, int flags, ...)) {
    va_list ap;
    va_start(ap, flags);
    const mode_t mode = (flags & O_CREAT) != 0 ? va_arg(ap, mode_t) : 0;
    va_end(ap);
    announce("open", pathOf(path), SCHEDULES_CALLER);
    return __real_open(path, flags, mode);
}

SCHEDULES_WRAP(int, rename, (const char* from, const char* to)) {
    announce("rename from", pathOf(from), SCHEDULES_CALLER);
    announce("rename to", pathOf(to), SCHEDULES_CALLER);
    return __real_rename(from, to);
}

SCHEDULES_WRAP(int, unlink, (const char* path)) {
    announce("unlink", pathOf(path), SCHEDULES_CALLER);
    return __real_unlink(path);
}

SCHEDULES_WRAP(int, stat, (const char* path, struct stat* st)) {
    announce("stat", pathOf(path), SCHEDULES_CALLER, Operation::READS);
    return __real_stat(path, st);
}

SCHEDULES_WRAP(int, access, (const char* path, int mode)) {
    announce("access", pathOf(path), SCHEDULES_CALLER, Operation::READS);
    return __real_access(path, mode);
}

// A number that is closed may be another file's the next moment.
SCHEDULES_WRAP(int, close, (int fd)) {
    announce("close", fileOf(fd), SCHEDULES_CALLER);
    return __real_close(fd);
}
