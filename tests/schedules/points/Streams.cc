#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>

#include "points/Files.h"
#include "points/Wrap.h"

// Streams that are written to. The C library's own code runs, buffers and all, over a file of ours
// (fopencookie), so that there is a point at each write(2) it makes: inside fwrite, inside fclose,
// and inside exit.

namespace schedules {

namespace {

// A stream's file. Never freed: a stream may be flushed by exit at any time.
struct Cookie {
    int fd;
};

// Streams concern everybody: a fork copies their buffers and exit flushes them, open or not.
void announceStream(const char* what, const void* caller) {
    announce(what, nullptr, caller);
}

ssize_t writeCookie(void* cookie, const char* data, size_t size) {
    const int fd = static_cast<Cookie*>(cookie)->fd;
    announceStream("write a stream's buffer", nullptr);
    const ssize_t written = write(fd, data, size);
    announceStream("have written a stream's buffer", nullptr);
    return written < 0 ? 0 : written;
}

int seekCookie(void* cookie, off64_t* offset, int whence) {
    const off_t at = lseek(static_cast<Cookie*>(cookie)->fd, *offset, whence);
    if (at < 0) return -1;
    *offset = at;
    return 0;
}

int closeCookie(void* cookie) {
    announceStream("close a stream's file", nullptr);
    return close(static_cast<Cookie*>(cookie)->fd);
}

}  // namespace

}  // namespace schedules

SCHEDULES_REAL(FILE*, fopen, (const char*, const char*));
SCHEDULES_REAL(size_t, fwrite, (const void*, size_t, size_t, FILE*));
SCHEDULES_REAL(int, fclose, (FILE*));

SCHEDULES_WRAP(FILE*, fopen, (const char* path, const char* mode)) {
    schedules::announce("open a stream", schedules::pathOf(path), SCHEDULES_CALLER);
    if (std::strchr(mode, 'w') == nullptr) return __real_fopen(path, mode);
    const int fd = open(path, O_WRONLY | O_CREAT | O_TRUNC, 0666);
    if (fd < 0) return nullptr;
    cookie_io_functions_t functions{};
    functions.write = &schedules::writeCookie;
    functions.seek = &schedules::seekCookie;
    functions.close = &schedules::closeCookie;
    return fopencookie(new schedules::Cookie{fd}, mode, functions);
}

SCHEDULES_WRAP(size_t, fwrite, (const void* data, size_t size, size_t n, FILE* file)) {
    schedules::announceStream("fwrite", SCHEDULES_CALLER);
    return __real_fwrite(data, size, n, file);
}

SCHEDULES_WRAP(int, fclose, (FILE * file)) {
    schedules::announceStream("fclose", SCHEDULES_CALLER);
    return __real_fclose(file);
}
