// Files and descriptors. Nothing throws or logs: check the result and errno.
#include <korvex/util/FileDescriptor.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

int main() {
    const Pathname dir("letters");
    std::printf("mkdir: %d\n", dir.mkdir(Pathname::MKDIR_PRIVATE));
    const bool again = dir.mkdir(Pathname::MKDIR_PRIVATE);
    std::printf("again: %d, %s\n", again, std::strerror(errno));

    const Pathname file = dir / "a.txt";
    {
        ScopedFileDescriptor out;
        out = file.openCreateOnly(Pathname::CREATE_NORMAL);
        out.format("dear %s\n", "reader");
    }  // closed here
    long long size = 0;
    file.getSize(&size);
    std::printf("%s has %lld bytes\n", file.c_str(), size);
    std::printf("copied: %d\n", file.copyTo(dir / "b.txt"));
    std::printf("onto itself: %d\n", file.copyTo(file));
    const bool there = file.openCreateOnly(Pathname::CREATE_NORMAL).valid();
    std::printf("create again: %d, %s\n", there, std::strerror(errno));

    char link[16] = "";
    Pathname("a.txt").symlinkTo(dir / "link");
    const bool read = (dir / "link").readlink(link, sizeof link - 1);
    std::printf("readlink: %d, \"%s\"\n", read, link);  // look at the buffer

    DirectoryDescriptor entries(dir);
    int count = 0;
    for (DirectoryEntry entry; entries.next(entry); ++count)
        (dir / entry).unlink();
    std::printf("removed %d files, then the directory: %d\n", count, dir.rmdir());
}
