#include <korvex/util/FileDescriptor.h>

#include <cerrno>
#include <utility>

inline namespace korvex {

DirectoryDescriptor::DirectoryDescriptor(const Pathname& path) : _dir(::opendir(path.c_str())) {}

DirectoryDescriptor::DirectoryDescriptor(DirectoryDescriptor&& other) noexcept
    : _dir(std::exchange(other._dir, nullptr)) {}

DirectoryDescriptor& DirectoryDescriptor::operator=(DirectoryDescriptor&& other) noexcept {
    std::swap(_dir, other._dir);
    return *this;
}

DirectoryDescriptor::~DirectoryDescriptor() {
    const int saved = errno;
    close();
    errno = saved;
}

bool DirectoryDescriptor::next(DirectoryEntry& entry) {
    if (_dir == nullptr) {
        errno = EBADF;
        return false;
    }
    const int saved = std::exchange(errno, 0);
    for (;;) {
        const struct dirent* const found = ::readdir(_dir);
        if (found == nullptr) {
            if (errno == 0) errno = saved;
            return false;
        }
        entry._name = found->d_name;
        if (entry._name == "." || entry._name == "..") continue;
        errno = saved;
        return true;
    }
}

bool DirectoryDescriptor::close() {
    return _dir == nullptr || ::closedir(std::exchange(_dir, nullptr)) == 0;
}

}  // namespace korvex
