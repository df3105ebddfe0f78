#include <korvex/util/FileDescriptor.h>

inline namespace korvex {

ScopedFileDescriptor::ScopedFileDescriptor(const Pathname& path)
    : FileDescriptor(path.openReadOnly()) {}

ScopedFileDescriptor::~ScopedFileDescriptor() {
    close_saveErrno();
}

ScopedFileDescriptor& ScopedFileDescriptor::operator=(const FileDescriptor& fd) {
    if (fd.osdep() == osdep()) return *this;
    close_saveErrno();
    FileDescriptor::operator=(fd);
    return *this;
}

ScopedFileDescriptor& ScopedFileDescriptor::operator=(ScopedFileDescriptor& other) {
    if (this == &other) return *this;
    return *this = static_cast<const FileDescriptor&>(other.release());
}

FileDescriptor ScopedFileDescriptor::release() {
    const FileDescriptor fd = *this;
    FileDescriptor::operator=(FileDescriptor());
    return fd;
}

ScopedSaferFileDescriptor::ScopedSaferFileDescriptor(const Pathname& path)
    : ScopedFileDescriptor(path.openReadOnlySafer()) {}

ScopedSaferFileDescriptor& ScopedSaferFileDescriptor::operator=(ScopedSaferFileDescriptor& other) {
    ScopedFileDescriptor::operator=(static_cast<ScopedFileDescriptor&>(other));
    return *this;
}

}  // namespace korvex
