#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <sys/stat.h>

#include <cstdint>

#include "file/StrictReader.h"

// A record file, opened once. A change by the tool puts another file in its place, so what is read
// through the descriptor is one moment's records.
class OpenFile {
  public:
    // Opens for reading only. Throws Failure IO_ERROR, also when there is no such file or it is
    // no regular one.
    explicit OpenFile(const Pathname& name);
    // The same with open(2)'s flags.
    OpenFile(const Pathname& name, int flags);

    int fd() const { return _fd.osdep(); }
    const Pathname& name() const { return _name; }
    // As it was when it was opened.
    const struct stat& stat() const { return _stat; }
    std::uint64_t size() const { return static_cast<std::uint64_t>(_stat.st_size); }
    // Looks at it anew, because it may have been changed before it was locked.
    void refresh();
    // Whether the name means this file.
    bool isStillNamed() const;
    // The same, and nobody has written to the file, nor changed its owner, mode, attributes or
    // links, since it was looked at.
    bool isUntouched() const;
    // Begins at the start of the file, and must not outlive this object.
    StrictReader reader() const;

  private:
    Pathname _name;
    ScopedFileDescriptor _fd;
    struct stat _stat {};
};

// Whether there is a file or directory of that name. A symbolic link to nothing is no missing file,
// since what it means may only not be mounted: throws Failure IO_ERROR, as for what cannot be
// looked at.
bool isThere(const Pathname& name);
