#include <korvex/util/FileDescriptor.h>

#include "base/PrintfBuffer.h"
#include "util/FileDescriptor/TransferAll.h"

#include <fcntl.h>
#include <unistd.h>

#include <new>

inline namespace korvex {

int FileDescriptor::read(void* p, unsigned long n) const {
    return transferAll(static_cast<char*>(p), n,
                       [this](char* to, std::size_t size) { return ::read(_osdep, to, size); });
}

int FileDescriptor::write(const void* p, unsigned long n) const {
    return transferAll(static_cast<const char*>(p), n, [this](const char* from, std::size_t size) {
        return ::write(_osdep, from, size);
    });
}

int FileDescriptor::writev(const struct iovec* vec, unsigned int n) const {
    return static_cast<int>(::writev(_osdep, vec, static_cast<int>(n)));
}

void FileDescriptor::vformat(const char* fmt, va_list va) const {
    try {
        const PrintfBuffer text(fmt, va);
        if (text.ok()) write(text.data(), text.size());
    } catch (const std::bad_alloc&) {  // nothing is written, as documented
        errno = ENOMEM;
    }
}

void FileDescriptor::format(const char* fmt, ...) const {
    va_list va;
    va_start(va, fmt);
    vformat(fmt, va);
    va_end(va);
}

int FileDescriptor::setCloseOnExec(bool onoff) const {
    const int flags = ::fcntl(_osdep, F_GETFD, 0);
    if (flags < 0) return flags;
    const int others = flags & ~FD_CLOEXEC;
    if (((flags & FD_CLOEXEC) != 0) == onoff) return others;
    return ::fcntl(_osdep, F_SETFD, onoff ? others | FD_CLOEXEC : others);
}

bool FileDescriptor::stat(struct stat* sbuf) const {
    return ::fstat(_osdep, sbuf) == 0;
}

bool FileDescriptor::getSize(long long* sizep) const {
    struct stat st {};
    if (!stat(&st)) return false;
    *sizep = st.st_size;
    return true;
}

bool FileDescriptor::seek_set(long long off) const {
    const off_t to = static_cast<off_t>(off);
    if (to != off) {
        errno = EOVERFLOW;
        return false;
    }
    return ::lseek(_osdep, to, SEEK_SET) != -1;
}

long long FileDescriptor::seekEof() const {
    return ::lseek(_osdep, 0, SEEK_END);
}

long long FileDescriptor::curPos() const {
    return ::lseek(_osdep, 0, SEEK_CUR);
}

int FileDescriptor::sync() const {
    return ::fsync(_osdep);
}

bool FileDescriptor::close() {
    if (!valid()) return true;
    const int result = ::close(_osdep);
    _osdep = -1;
    return result == 0;
}

void FileDescriptor::close_saveErrno() {
    const int saved = errno;
    if (!close()) errno = saved;
}

}  // namespace korvex
