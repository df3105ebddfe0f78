#pragma once

#include <korvex/Export.h>
#include <korvex/util/Pathname.h>

#include <dirent.h>
#include <sys/stat.h>
#include <sys/uio.h>

#include <cstdarg>
#include <string>

KORVEX_NAMESPACE(korvex) {

// A POSIX descriptor number, or -1 for none. A plain value: copies mean the same open file, and
// nothing closes it by itself. Members neither throw nor log; failure is told by the result, with
// errno as the failing call left it. As thread-safe as the calls beneath.
class FileDescriptor {
  public:
    // None, or the one of that number.
    FileDescriptor() = default;
    explicit FileDescriptor(int osdep) : _osdep(osdep) {}

    // Whether there is a descriptor (the number is not negative), and its number.
    bool valid() const { return _osdep >= 0; }
    int osdep() const { return _osdep; }

    // Whole-buffer read(2) and write(2): go on after short counts and interruptions, up to INT_MAX
    // bytes. The number of bytes moved; fewer than n means the end of the file, or an error after
    // some data, which errno then tells. 0 or -1 when nothing was moved.
    int read(void* p, unsigned long n) const;
    int write(const void* p, unsigned long n) const;
    // One writev(2); its result.
    int writev(const struct iovec* vec, unsigned int n) const;
    // Writes a text formatted as by printf(3). What the write says is not reported; a conversion
    // that fails, or memory that runs out, writes nothing.
    void vformat(const char* fmt, va_list va) const __attribute__((format(printf, 2, 0)));
    void format(const char* fmt, ...) const __attribute__((format(printf, 2, 3)));

    // fcntl(2) F_GETFD, and F_SETFD where the flag must change. Negative on failure.
    int setCloseOnExec(bool onoff) const;
    // fstat(2).
    bool stat(struct stat* sbuf) const;
    // The size in bytes; *sizep is untouched on failure.
    bool getSize(long long* sizep) const;
    // lseek(2), offsets in bytes: from the start; to the end; not at all. The two latter return the
    // new offset, -1 on failure. EOVERFLOW when the platform's off_t cannot hold the offset.
    bool seek_set(long long off) const;
    long long seekEof() const;
    long long curPos() const;
    // fsync(2); its result.
    int sync() const;

    // close(2); there is no descriptor afterwards, whatever the result. True when there was none.
    bool close();
    // The same, except that a failure leaves errno as it was.
    void close_saveErrno();

    // Copies from here to the end of the file, from both current positions on. ENOSPC when a write
    // makes no progress.
    bool copyTo(FileDescriptor outfd) const;
    // The same into a new or emptied file with this file's permission bits. False, with nothing
    // done, when there is no descriptor, or when dest is this very file (device and inode), which
    // errno EINVAL tells.
    bool copyTo(const Pathname& dest) const;

  private:
    int _osdep = -1;
};

// A descriptor that is closed, errno kept, when this object goes. It has one owner: copying is not
// possible, and assigning one to another hands the descriptor over.
class ScopedFileDescriptor : public FileDescriptor {
  public:
    ScopedFileDescriptor() = default;
    // Opens with Pathname::openReadOnly(); look at valid().
    explicit ScopedFileDescriptor(const Pathname& path);
    // Takes ownership.
    explicit ScopedFileDescriptor(const FileDescriptor& fd) : FileDescriptor(fd) {}
    ScopedFileDescriptor(const ScopedFileDescriptor&) = delete;
    ~ScopedFileDescriptor();

    // Closes the present descriptor, errno kept, and takes the other number, which it then owns.
    // Nothing when that is the number it has.
    ScopedFileDescriptor& operator=(const FileDescriptor& fd);
    // The same; `other` gives its descriptor up.
    ScopedFileDescriptor& operator=(ScopedFileDescriptor& other);
    ScopedFileDescriptor& operator=(const ScopedFileDescriptor&) = delete;

    // Gives the descriptor up without closing it.
    FileDescriptor release();
};

// The same, opened with Pathname::openReadOnlySafer().
class ScopedSaferFileDescriptor : public ScopedFileDescriptor {
  public:
    // As the base's, but for the way of opening.
    ScopedSaferFileDescriptor() = default;
    explicit ScopedSaferFileDescriptor(const Pathname& path);
    explicit ScopedSaferFileDescriptor(const FileDescriptor& fd) : ScopedFileDescriptor(fd) {}
    ScopedSaferFileDescriptor(const ScopedSaferFileDescriptor&) = delete;
    ~ScopedSaferFileDescriptor() = default;

    using ScopedFileDescriptor::operator=;
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

// An open directory, closed when this object goes. Belongs to one thread at a time.
class DirectoryDescriptor {
  public:
    DirectoryDescriptor() = default;
    // Opens it by opendir(3); look at valid().
    explicit DirectoryDescriptor(const Pathname& path);
    DirectoryDescriptor(DirectoryDescriptor&& other) noexcept;
    DirectoryDescriptor& operator=(DirectoryDescriptor&& other) noexcept;
    DirectoryDescriptor(const DirectoryDescriptor&) = delete;
    DirectoryDescriptor& operator=(const DirectoryDescriptor&) = delete;
    ~DirectoryDescriptor();

    // Whether it is open.
    bool valid() const { return _dir != nullptr; }
    // The next entry but "." and "..", in no particular order: readdir(3). False at the end, errno
    // left alone, and on failure, with errno set (EBADF when it is not open); set errno to 0
    // beforehand to tell which.
    bool next(DirectoryEntry& entry);
    // closedir(3); true when it was not open.
    bool close();

  private:
    DIR* _dir = nullptr;
};

}  // KORVEX_NAMESPACE(korvex)
