#include "file/OpenFile.h"

#include <fcntl.h>

#include <cerrno>

#include "terminal/Progress.h"

bool isThere(const Pathname& name) {
    struct stat st {};
    if (name.stat(&st)) return true;
    if (errno != ENOENT) throw Failure(IO_ERROR, withErrno("cannot look at " + name));
    if (lstat(name.c_str(), &st) == 0 && S_ISLNK(st.st_mode)) {
        throw Failure(IO_ERROR, name + ": a symbolic link to a file that is not there");
    }
    return false;
}

OpenFile::OpenFile(const Pathname& name) : OpenFile(name, O_RDONLY) {}

OpenFile::OpenFile(const Pathname& name, int flags) : _name(name) {
    if (!isThere(name)) throw Failure(IO_ERROR, name + ": no such file");
    // Looked at before it is opened: a FIFO would hold us up for ever.
    if (!name.stat(&_stat)) throw Failure(IO_ERROR, withErrno("cannot look at " + name));
    if (!S_ISREG(_stat.st_mode)) throw Failure(IO_ERROR, name + ": not a regular file");
    progressStep("reading", size());
    _fd = FileDescriptor(::open(name.c_str(), flags | O_CLOEXEC | O_NOCTTY));
    if (!_fd.valid() || !_fd.stat(&_stat))
        throw Failure(IO_ERROR, withErrno("cannot open " + name));
    if (!S_ISREG(_stat.st_mode)) throw Failure(IO_ERROR, name + ": not a regular file");
}

StrictReader OpenFile::reader() const {
    return {fd(), size(), _name};
}

void OpenFile::refresh() {
    if (!_fd.stat(&_stat)) throw Failure(IO_ERROR, withErrno("cannot look at " + _name));
}

bool OpenFile::isStillNamed() const {
    struct stat st {};
    return _name.stat(&st) && st.st_dev == _stat.st_dev && st.st_ino == _stat.st_ino;
}

bool OpenFile::isUntouched() const {
    // The time of the last change of the file's state, since a new mode, access control list or
    // hard link must not be lost either. Writing sets it too.
    struct stat st {};
    return isStillNamed() && _fd.stat(&st) && st.st_size == _stat.st_size &&
           st.st_ctim.tv_sec == _stat.st_ctim.tv_sec && st.st_ctim.tv_nsec == _stat.st_ctim.tv_nsec;
}
