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

// A file-system path: a byte string, never validated, with '/' as the only separator. Everything a
// std::string offers is available on it. Members that only look at the text throw nothing but
// std::bad_alloc. Those that call the system neither throw nor log: they tell failure by their
// result, with errno as the failing call left it; success and a plain "no" leave errno alone.
// As thread-safe as a std::string.
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
        CREATE_READABLE_NONPUBLIC = 2  // 0440: nobody may write it, not even its owner
    };

    // The text as it stands; nothing is tidied.
    Pathname() = default;
    Pathname(const char* s) : std::string(s) {}         // NOLINT: a path is its text
    Pathname(const std::string& s) : std::string(s) {}  // NOLINT
    Pathname(const char* s, std::size_t length) : std::string(s, length) {}
    // The entry's name, without its directory.
    explicit Pathname(const DirectoryEntry& entry);

    // Joining: appends one element behind exactly one separator; leading separators of the element
    // are dropped, everything else in it stays. An empty element changes nothing. The separator
    // comes even after an empty path: "" / "b" is "/b".
    Pathname& operator/=(const std::string& s);
    Pathname& operator/=(const char* s);
    Pathname& operator/=(const DirectoryEntry& entry);
    Pathname operator/(const std::string& s) const;
    Pathname operator/(const char* s) const;
    Pathname operator/(const DirectoryEntry& entry) const;

    // Whether the text begins with, or contains, a separator.
    bool isAbsolute() const;
    bool containsSep() const;
    // The last element without separators; "/" when there is none, so for an empty path too.
    Pathname toLeaf() const;
    // This path after stripElement(): the parent of "a" is "", not ".".
    Pathname toParent() const;
    // What follows the last element's last dot: "a.tar.gz" gives "gz", ".profile" gives "profile".
    // Empty without one, and when the path ends in a separator or a dot.
    std::string ext() const;
    // The last element up to its last dot; whole when that dot comes first, so ".profile" stays
    // ".profile". Empty when the path ends in a separator.
    std::string basenameWithoutExt() const;

    // Appends a separator unless there is one; "" becomes "/".
    void addTrailingSep();
    // Removes separators at the end, but never the first character.
    void removeTrailingSeps();
    // Removes the last element with the separators around it: "a//b/" becomes "a", "/a" becomes
    // "/", "a" becomes "". "/" stays.
    void stripElement();
    // Deletes every ".." element: "a/../b" becomes "a/b". Resolves nothing: it keeps a relative
    // path from climbing out of its base. Linear.
    void removeDotDotSlash();
    // Makes one separator of each run of them. Linear. The static forms return a changed copy.
    void removeDoubleSeps();
    static Pathname removeDoubleSeps(const Pathname& p);
    static Pathname removeDoubleSeps(const char* p);

    // The path as one word of a POSIX shell, quoted only where it holds a blank (space, tab,
    // newline), a quote, or one of $ \ # & * ; = ? [ ] |. Other characters that a shell treats
    // specially, such as ( ) < > ~ ` and carriage return, are left alone. "" is "\"\"".
    std::string shellQuoted() const;
    // Reads the first shell word of `s` into `arg`, unquoted, and what follows it, with the blank
    // that ended it, into `rest`; `s` may be one of them. Inside double quotes a backslash escapes
    // any character. False, with `rest` untouched and `arg` holding what was read, when a quote is
    // not closed, a backslash ends the text, or the word is empty.
    static bool splitArgShellQuoted(const std::string& s, Pathname& arg, std::string& rest);

    // stat(2); st is untouched on failure.
    bool stat(struct stat* st) const;
    // Whether it is there and a directory, or a regular file. Links are followed: stat(2).
    bool isDir() const;
    bool isReg() const;
    // Time of last modification in seconds since the epoch, and size in bytes: stat(2). The output
    // is untouched on failure.
    bool getMtime(time_t* t) const;
    bool getSize(long long* n) const;
    // access(2) with F_OK, R_OK, W_OK, and R_OK with W_OK.
    bool exists() const;
    bool r_ok() const;
    bool w_ok() const;
    bool rw_ok() const;

    // mkdir(2). A mode that is none of the presets is a failed assertion.
    bool mkdir(MkdirMode mode) const;
    // rmdir(2), unlink(2), remove(3).
    bool rmdir() const;
    bool unlink() const;
    bool remove() const;
    // truncate(2); length in bytes. EFBIG when the platform's off_t cannot hold it.
    bool truncate(long long length) const;
    // readlink(2) into buf, without a NUL. True only when the call returned exactly 0, so false
    // whenever a link was read: look at the buffer, not at the result.
    bool readlink(char* buf, unsigned long size) const;
    // symlink(2): makes `link` a symbolic link that holds this path.
    bool symlinkTo(const Pathname& link) const;
    // rename(2).
    bool renameTo(const Pathname& to) const;
    // Copies the file's content and permission bits; see FileDescriptor::copyTo.
    bool copyTo(const Pathname& to) const;
    // fopen(3). The caller closes it.
    std::FILE* fopen(const char* mode) const;
    // opendir(3); not valid() on failure.
    DirectoryDescriptor opendir() const;

    // open(2). The result, -1 on failure, is the caller's to close. None sets close-on-exec.
    FileDescriptor openReadOnly() const;
    // Does not block on a FIFO or device without a peer, and stays non-blocking.
    FileDescriptor openReadOnlySafer() const;
    // Write-only. EEXIST when the file is there.
    FileDescriptor openCreateOnly(CreateMode cm) const;
    // Write-only, emptied. With a model: its permission bits, by fstat(2); nothing is opened when
    // that fails.
    FileDescriptor openCreateOrReplace(CreateMode cm) const;
    FileDescriptor openCreateOrReplace(FileDescriptor model) const;
    // Write-only, each write at the end.
    FileDescriptor openCreateOrAppend(CreateMode cm) const;
    // Read and write. Empties a file that is there, whatever the name promises.
    FileDescriptor openReadWriteOrCreate(CreateMode cm) const;
};

// Paths in the order in which they were added, such as a search path. Duplicates stay.
class PathList : public std::vector<Pathname> {
  public:
    static const char listSep;  // ':', the usual separator; callers pass theirs explicitly

    PathList() = default;
    // A set's elements, in its order.
    PathList(std::set<Pathname>::const_iterator first, std::set<Pathname>::const_iterator last);
    // What push_back_separated adds.
    PathList(const char* s, char sep);
    PathList(const std::string& s, char sep);

    // Appends the pieces of s, which must not be null, between separators, up to its first NUL.
    // Empty pieces are skipped.
    void push_back_separated(const char* s, char sep);
};

}  // KORVEX_NAMESPACE(korvex)
