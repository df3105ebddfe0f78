#include "PidFile.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <stdexcept>

#include "Failure.h"

// Not by Pathname::openReadWriteOrCreate, which would empty another process's file.
PidFile::PidFile(const Pathname& path)
    : _path(path), _fd(FileDescriptor(open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0644))) {
    if (!_fd.valid()) throw systemFailure("cannot open " + path);
    if (flock(_fd.osdep(), LOCK_EX | LOCK_NB) != 0) {
        throw std::runtime_error("already running: another process has locked " + path);
    }
    path.truncate(0);
    _fd.format("%ld\n", static_cast<long>(getpid()));  // LoaderInfo's is from before the fork
}

PidFile::~PidFile() {
    _path.truncate(0);
}
