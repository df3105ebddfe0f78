#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <fcntl.h>

inline namespace korvex {

namespace {

mode_t createmode_to_perm(Pathname::CreateMode cm) {
    if (cm == Pathname::CREATE_PRIVATE) return 0600;
    if (cm == Pathname::CREATE_READABLE_NONPUBLIC) return 0440;
    return 0644;
}

FileDescriptor openFile(const Pathname& path, int flags, mode_t perm = 0) {
    return FileDescriptor(::open(path.c_str(), flags, perm));
}

}  // namespace

FileDescriptor Pathname::openReadOnly() const {
    return openFile(*this, O_RDONLY);
}

FileDescriptor Pathname::openReadOnlySafer() const {
    return openFile(*this, O_RDONLY | O_NONBLOCK);
}

FileDescriptor Pathname::openCreateOnly(CreateMode cm) const {
    return openFile(*this, O_WRONLY | O_CREAT | O_EXCL, createmode_to_perm(cm));
}

FileDescriptor Pathname::openCreateOrReplace(CreateMode cm) const {
    return openFile(*this, O_WRONLY | O_CREAT | O_TRUNC, createmode_to_perm(cm));
}

FileDescriptor Pathname::openCreateOrReplace(FileDescriptor model) const {
    struct stat st {};
    if (!model.stat(&st)) return {};
    return openFile(*this, O_WRONLY | O_CREAT | O_TRUNC, st.st_mode & 0777U);
}

FileDescriptor Pathname::openCreateOrAppend(CreateMode cm) const {
    return openFile(*this, O_WRONLY | O_CREAT | O_APPEND, createmode_to_perm(cm));
}

FileDescriptor Pathname::openReadWriteOrCreate(CreateMode cm) const {
    return openFile(*this, O_RDWR | O_CREAT | O_TRUNC, createmode_to_perm(cm));
}

}  // namespace korvex
