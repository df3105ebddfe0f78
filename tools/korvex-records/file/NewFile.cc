#include "file/NewFile.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "file/Attributes.h"
#include "file/NewFileName.h"
#include "terminal/Progress.h"

Pathname directoryOf(const Pathname& file) {
    const Pathname parent = file.toParent();
    return parent.empty() ? Pathname::cur : parent;
}

// Not every file system can, and not every directory that may be written to may be opened.
void syncDirectory(const Pathname& directory) {
    const ScopedFileDescriptor fd(directory);
    if (!fd.valid() || fd.sync() == 0 || errno == EINVAL || errno == ENOTSUP) return;
    throw Failure(IO_ERROR, withErrno("saved, but cannot sync " + directory));
}

NewFile::NewFile(const Pathname& directory) : _directory(directory) {
    while (!make())
        continue;
}

NewFile::~NewFile() {
    if (_isBeside) _name.unlink();
}

// False when the name is taken, or when a sweep has come between making it and locking it.
bool NewFile::make() {
    _name = _directory / inventNewFileName();
    _fd = FileDescriptor(
        ::open(_name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600));
    if (!_fd.valid() && errno == EEXIST) return false;
    if (!_fd.valid()) throw Failure(IO_ERROR, withErrno("cannot make a file in " + _directory));
    struct stat st {};
    const bool isLocked = flock(_fd.osdep(), LOCK_EX | LOCK_NB) == 0;
    if (!isLocked && errno != EWOULDBLOCK) {
        const std::string why = withErrno("cannot lock " + _name);
        _name.unlink();
        throw Failure(IO_ERROR, why);
    }
    _isBeside = isLocked && _fd.stat(&st) && st.st_nlink > 0;
    return _isBeside;
}

void NewFile::save(const RecordMemory& memory, const Pathname& target) {
    progressStep("saving");
    const int why = memory.save(_name);
    if (holdsJust(memory)) return;
    throw Failure(IO_ERROR,
                  "cannot save " + target + ": writing " + _name + ": " +
                      (why == 0 ? "it does not hold what was written (the log may say why)"
                                : std::strerror(why)));
}

bool NewFile::holdsJust(const RecordMemory& memory) const {
    struct stat st {};
    if (!_fd.stat(&st)) return false;
    StrictReader reader(_fd.osdep(), static_cast<std::uint64_t>(st.st_size), _name);
    progressStep("comparing", static_cast<std::uint64_t>(st.st_size));
    while (reader.next()) {
        if (!memory.holds(reader.key(), reader.value())) return false;
    }
    const Scan& found = reader.found();
    return found.whole() && found.version == kVersion && found.records == memory.size();
}

void NewFile::sync() const {
    progressStep("syncing");
    if (_fd.sync() != 0) throw Failure(IO_ERROR, withErrno("cannot sync " + _name));
}

void NewFile::replace(OpenFile& old) {
    keepAttributes(old, _fd.osdep());
    sync();
    if (!old.isUntouched()) {
        throw Failure(IO_ERROR, old.name() +
                                    ": another program has changed it meanwhile; "
                                    "nothing was written");
    }
    if (!_name.renameTo(old.name())) {
        throw Failure(IO_ERROR, withErrno("cannot rename " + _name + " to " + old.name()));
    }
    _isBeside = false;
    syncDirectory(_directory);
}

bool NewFile::becomes(const Pathname& name) {
    sync();
    if (link(_name.c_str(), name.c_str()) != 0) {
        if (errno == EEXIST) return false;
        throw Failure(IO_ERROR, withErrno("cannot link " + _name + " to " + name));
    }
    if (!_name.unlink()) throw Failure(IO_ERROR, withErrno("saved, but cannot remove " + _name));
    _isBeside = false;
    syncDirectory(_directory);
    return true;
}
