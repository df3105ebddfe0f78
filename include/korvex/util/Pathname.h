#pragma once

#include <korvex/Export.h>

#include <sys/stat.h>

#include <cstdio>
#include <ctime>
#include <set>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class DirectoryDescriptor;
class DirectoryEntry;
class FileDescriptor;

// A file-system path: a byte string, never validated, with '/' as the only separator. All members
// of std::string are available. Members that only use the text throw nothing but std::bad_alloc.
// Members that call the system neither throw nor log: a failure shows in the result, and errno is
// as the failing call left it. Success, and a plain "no", leave errno alone. As thread-safe as a
// std::string.
class Pathname : public std::string {
  public:
    static const char sep;         // '/'
    static const Pathname root;    // "/"
    static const Pathname cur;     // "."
    static const Pathname parent;  // ".."

    // Permission presets of mkdir(); the umask applies.
    enum MkdirMode : int {
        MKDIR_PRIVATE = 0,    // 0700
        MKDIR_GROUP_RW = 1,   // 0770
        MKDIR_PUBLIC = 2,     // 0777
        MKDIR_WORLD_READ = 3  // 0755
    };
    // Permission presets of new files; the umask applies. Any other value is CREATE_NORMAL.
    enum CreateMode : int {
        CREATE_NORMAL = 0,             // 0644
        CREATE_PRIVATE = 1,            // 0600
        CREATE_READABLE_NONPUBLIC = 2  // 0440: nobody may open it for writing, not even its owner
    };

    // The text, unchanged.
    Pathname() = default;
    Pathname(const char* s) : std::string(s) {}         // NOLINT: a path is its text
    Pathname(const std::string& s) : std::string(s) {}  // NOLINT
    Pathname(const char* s, std::size_t length) : std::string(s, length) {}
    // The name of the entry, without its directory.
    explicit Pathname(const DirectoryEntry& entry);

    // Joining: appends one element after exactly one separator. Leading separators of the element
    // are dropped; the rest of it stays the same. An empty element changes nothing. An empty path
    // gets the separator too: "" / "b" is "/b".
    Pathname& operator/=(const std::string& s);
    Pathname& operator/=(const char* s);
    Pathname& operator/=(const DirectoryEntry& entry);
    Pathname operator/(const std::string& s) const;
    Pathname operator/(const char* s) const;
    Pathname operator/(const DirectoryEntry& entry) const;

    // Whether the text begins with, or contains, a separator.
    bool isAbsolute() const;
    bool containsSep() const;
    // The last element without separators; "/" if there is none, as in an empty path.
    Pathname toLeaf() const;
    // A copy of this path after stripElement(): the parent of "a" is "", not ".".
    Pathname toParent() const;
    // What follows the last dot of the last element: "a.tar.gz" gives "gz", ".profile" gives
    // "profile". Empty if there is no dot, or if the path ends in a separator or a dot.
    std::string ext() const;
    // The last element up to its last dot. All of it if that dot is its first character: ".profile"
    // stays ".profile". Empty if the path ends in a separator.
    std::string basenameWithoutExt() const;

    // Appends a separator unless the path ends in one; "" becomes "/".
    void addTrailingSep();
    // Removes separators at the end, but never the first character.
    void removeTrailingSeps();
    // Removes the last element and the separators around it: "a//b/" becomes "a", "/a" becomes
    // "/", "a" becomes "". "/" stays.
    void stripElement();
    // Deletes every ".." element: "a/../b" becomes "a/b". It does not resolve the path. It keeps a
    // relative path from leaving the directory that it is joined to. Takes linear time.
    void removeDotDotSlash();
    // Replaces each run of separators by one. Takes linear time. The static forms return a changed
    // copy.
    void removeDoubleSeps();
    static Pathname removeDoubleSeps(const Pathname& p);
    static Pathname removeDoubleSeps(const char* p);

    // The path as one word of a POSIX shell, quoted only where it holds a blank (space, tab,
    // newline), a quote, or one of $ \ # & * ; = ? [ ] |. Other characters that a shell treats
    // specially, such as ( ) < > ~ ` and carriage return, are left alone. "" is "\"\"".
    std::string shellQuoted() const;
    // Stores the first shell word of `s`, unquoted, in `arg`, and what follows it in `rest`, with
    // the blank that ended the word. `s` may be one of them. Inside double quotes a backslash
    // escapes any character. False if a quote is not closed, if a backslash ends the text, or if
    // the word is empty; then `rest` is untouched and `arg` holds what was read.
    static bool splitArgShellQuoted(const std::string& s, Pathname& arg, std::string& rest);

    // stat(2); st is untouched on failure.
    bool stat(struct stat* st) const;
    // Whether the path is a directory, or a regular file, by stat(2). Links are followed.
    bool isDir() const;
    bool isReg() const;
    // The time of the last modification in seconds since the epoch, and the size in bytes, by
    // stat(2). The output is untouched on failure.
    bool getMtime(time_t* t) const;
    bool getSize(long long* n) const;
    // access(2) with F_OK, R_OK, W_OK, and R_OK with W_OK.
    bool exists() const;
    bool r_ok() const;
    bool w_ok() const;
    bool rw_ok() const;

    // mkdir(2). A mode that is not a preset is a failed assertion.
    bool mkdir(MkdirMode mode) const;
    // rmdir(2), unlink(2), remove(3).
    bool rmdir() const;
    bool unlink() const;
    bool remove() const;
    // truncate(2), with the length in bytes. EFBIG if the platform's off_t cannot hold it.
    bool truncate(long long length) const;
    // readlink(2) into buf, without a NUL. True only if the call returned exactly 0, so false
    // whenever a link was read. Use the buffer, not the result.
    bool readlink(char* buf, unsigned long size) const;
    // symlink(2): creates the symbolic link `link`, which points to this path.
    bool symlinkTo(const Pathname& link) const;
    // rename(2).
    bool renameTo(const Pathname& to) const;
    // Copies the content and the permission bits of the file; see FileDescriptor::copyTo.
    bool copyTo(const Pathname& to) const;
    // fopen(3). The caller closes it.
    std::FILE* fopen(const char* mode) const;
    // opendir(3); not valid() on failure.
    DirectoryDescriptor opendir() const;

    // open(2). The result is -1 on failure. The caller closes it. None of these sets close-on-exec.
    FileDescriptor openReadOnly() const;
    // Does not block on a FIFO or a device without a peer. The descriptor stays non-blocking.
    FileDescriptor openReadOnlySafer() const;
    // Write-only. EEXIST if the file exists.
    FileDescriptor openCreateOnly(CreateMode cm) const;
    // Write-only. Empties a file that exists. With a model, a new file has its permission bits, by
    // fstat(2); if that fails, nothing is opened.
    FileDescriptor openCreateOrReplace(CreateMode cm) const;
    FileDescriptor openCreateOrReplace(FileDescriptor model) const;
    // Write-only. Each write appends.
    FileDescriptor openCreateOrAppend(CreateMode cm) const;
    // Read and write. Despite its name, empties a file that exists.
    FileDescriptor openReadWriteOrCreate(CreateMode cm) const;
};

// Paths in the order in which they were added, as in a search path. Duplicates stay.
class PathList : public std::vector<Pathname> {
  public:
    static const char listSep;  // ':', the usual separator; callers pass one explicitly

    PathList() = default;
    // The elements of a set, in its order.
    PathList(std::set<Pathname>::const_iterator first, std::set<Pathname>::const_iterator last);
    // The pieces of s, as push_back_separated() adds them.
    PathList(const char* s, char sep);
    PathList(const std::string& s, char sep);

    // Splits s at the separators, up to its first NUL, and appends the pieces that are not empty. s
    // must not be null.
    void push_back_separated(const char* s, char sep);
};

}  // KORVEX_NAMESPACE(korvex)
