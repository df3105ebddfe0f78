#pragma once

#include <korvex/Export.h>
#include <korvex/util/Pathname.h>

#include <dirent.h>
#include <sys/stat.h>
#include <sys/uio.h>

#include <cstdarg>
#include <string>

KORVEX_NAMESPACE(korvex) {

// A POSIX descriptor number, or -1 for none. A plain value: copies refer to the same open file, and
// the destructor does not close it. Members neither throw nor log. A failure shows in the result,
// and errno is as the failing call left it. As thread-safe as the system calls that they make.
class FileDescriptor {
  public:
    // No descriptor, or the one with that number.
    FileDescriptor() = default;
    explicit FileDescriptor(int osdep) : _osdep(osdep) {}

    // Whether there is a descriptor (the number is not negative), and its number.
    bool valid() const { return _osdep >= 0; }
    int osdep() const { return _osdep; }

    // read(2) and write(2) of the whole buffer, up to INT_MAX bytes: they continue after short
    // counts and interruptions. The result is the number of bytes moved. Fewer than n means the end
    // of the file, or an error after some data; errno then has the error. 0 or -1 if nothing was
    // moved.
    int read(void* p, unsigned long n) const;
    int write(const void* p, unsigned long n) const;
    // One writev(2). Returns its result.
    int writev(const struct iovec* vec, unsigned int n) const;
    // Writes a text formatted as by printf(3). A failure of the write is not reported. If a
    // conversion fails or memory runs out, nothing is written.
    void vformat(const char* fmt, va_list va) const __attribute__((format(printf, 2, 0)));
    void format(const char* fmt, ...) const __attribute__((format(printf, 2, 3)));

    // fcntl(2) F_GETFD, and F_SETFD if the flag must change. Negative on failure.
    int setCloseOnExec(bool onoff) const;
    // fstat(2).
    bool stat(struct stat* sbuf) const;
    // The size in bytes; *sizep is untouched on failure.
    bool getSize(long long* sizep) const;
    // lseek(2), with offsets in bytes: seek_set() moves to an offset from the start, seekEof() to
    // the end, and curPos() does not move. seekEof() and curPos() return the offset, or -1 on
    // failure. EOVERFLOW if the platform's off_t cannot hold the offset.
    bool seek_set(long long off) const;
    long long seekEof() const;
    long long curPos() const;
    // fsync(2). Returns its result.
    int sync() const;

    // close(2). Afterwards there is no descriptor, whatever the result. True if there was none.
    bool close();
    // The same, but a failure leaves errno as it was.
    void close_saveErrno();

    // Copies from the current position to the end of the file, to the current position of `outfd`.
    // ENOSPC if a write makes no progress.
    bool copyTo(FileDescriptor outfd) const;
    // The same to the file dest, which is emptied first, or created with the permission bits of
    // this file. False, with nothing done, if there is no descriptor, or if dest is this same file
    // by device and inode (errno is EINVAL).
    bool copyTo(const Pathname& dest) const;

  private:
    int _osdep = -1;
};

// A descriptor that is closed when this object is destroyed; errno is kept. It has one owner: it
// cannot be copied, and an assignment moves the descriptor.
class ScopedFileDescriptor : public FileDescriptor {
  public:
    ScopedFileDescriptor() = default;
    // Opens with Pathname::openReadOnly(). Test valid() afterwards.
    explicit ScopedFileDescriptor(const Pathname& path);
    // Takes ownership.
    explicit ScopedFileDescriptor(const FileDescriptor& fd) : FileDescriptor(fd) {}
    ScopedFileDescriptor(const ScopedFileDescriptor&) = delete;
    ~ScopedFileDescriptor();

    // Closes the present descriptor, with errno kept, and takes ownership of the other one. Does
    // nothing if both are the same number.
    ScopedFileDescriptor& operator=(const FileDescriptor& fd);
    // The same. `other` has no descriptor afterwards.
    ScopedFileDescriptor& operator=(ScopedFileDescriptor& other);
    ScopedFileDescriptor& operator=(const ScopedFileDescriptor&) = delete;

    // Returns the descriptor without closing it; this object has none afterwards.
    FileDescriptor release();
};

// The same, opened with Pathname::openReadOnlySafer().
class ScopedSaferFileDescriptor : public ScopedFileDescriptor {
  public:
    // As in the base class, except for the way of opening.
    ScopedSaferFileDescriptor() = default;
    explicit ScopedSaferFileDescriptor(const Pathname& path);
    explicit ScopedSaferFileDescriptor(const FileDescriptor& fd) : ScopedFileDescriptor(fd) {}
    ScopedSaferFileDescriptor(const ScopedSaferFileDescriptor&) = delete;
    ~ScopedSaferFileDescriptor() = default;

    using ScopedFileDescriptor::operator=;
    // As in the base class.
    ScopedSaferFileDescriptor& operator=(ScopedSaferFileDescriptor& other);
    ScopedSaferFileDescriptor& operator=(const ScopedSaferFileDescriptor&) = delete;
};

// One name in a directory.
class DirectoryEntry {
  public:
    // The name, without its directory.
    const std::string& name() const { return _name; }

  private:
    friend class DirectoryDescriptor;

    std::string _name;
};

// An open directory, closed when this object is destroyed. For one thread at a time.
class DirectoryDescriptor {
  public:
    DirectoryDescriptor() = default;
    // Opens it by opendir(3). Test valid() afterwards.
    explicit DirectoryDescriptor(const Pathname& path);
    DirectoryDescriptor(DirectoryDescriptor&& other) noexcept;
    DirectoryDescriptor& operator=(DirectoryDescriptor&& other) noexcept;
    DirectoryDescriptor(const DirectoryDescriptor&) = delete;
    DirectoryDescriptor& operator=(const DirectoryDescriptor&) = delete;
    ~DirectoryDescriptor();

    // Whether it is open.
    bool valid() const { return _dir != nullptr; }
    // The next entry except "." and "..", in no particular order, by readdir(3). False at the end,
    // with errno unchanged. False on failure, with errno set (EBADF if it is not open). Set errno
    // to 0 before the call to distinguish the two.
    bool next(DirectoryEntry& entry);
    // closedir(3). True if it was not open.
    bool close();

  private:
    DIR* _dir = nullptr;
};

}  // KORVEX_NAMESPACE(korvex)
