#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <tuple>
#include <variant>
#include <vector>

// What a program did to one directory, event by event.
namespace crashstates {

// A file, whatever its names; numbered by us, because a file system uses its numbers again.
using Inode = unsigned;

// Mode, owner and extended attributes, as text.
using Attributes = std::map<std::string, std::string>;

struct File {
    std::string bytes;
    Attributes attributes;

    friend bool operator==(const File& a, const File& b) {
        return a.bytes == b.bytes && a.attributes == b.attributes;
    }
    friend bool operator<(const File& a, const File& b) {
        return std::tie(a.bytes, a.attributes) < std::tie(b.bytes, b.attributes);
    }
};

using Names = std::map<std::string, Inode>;

struct Directory {
    Names names;
    std::map<Inode, File> files;
};

// A new file, empty, under its first name. Without one (O_TMPFILE) the name is empty.
struct Create {
    std::string name;
    Inode inode;
    Attributes attributes;
};
struct Write {
    Inode inode;
    std::uint64_t offset;  // bytes from the beginning
    std::string bytes;
};
struct Truncate {
    Inode inode;
    std::uint64_t size;  // bytes; a larger one adds zeros
};
struct SetAttribute {
    Inode inode;
    std::string name;
    std::optional<std::string> value;  // none: removed
};
struct Link {
    Inode inode;
    std::string name;
};
struct Rename {
    std::string from;
    std::string to;
};
struct Unlink {
    std::string name;
};
// fsync(2), or fdatasync(2), which leaves the attributes out.
struct SyncFile {
    Inode inode;
    bool dataOnly;
};
struct SyncDirectory {};

using Event = std::variant<Create, Write, Truncate, SetAttribute, Link, Rename, Unlink, SyncFile,
                           SyncDirectory>;

// What was in the directory, all of it on the disk, and what then happened.
struct History {
    Directory before;
    std::vector<Event> events;
};

// For messages: 'rename "a" to "b"'.
std::string describe(const Event& event);

}  // namespace crashstates
