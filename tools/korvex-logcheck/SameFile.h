#pragma once

#include <sys/types.h>

#include <string>

// What a name of a file leads to.
struct FileIdentity {
    std::string canonical;  // normalised, and links followed as far as there are any
    std::string entry;      // the same, but for a link that the last component is
    bool isDevice;          // or anything else that takes lines from any number
    bool exists;
    dev_t device;
    ino_t inode;
};

FileIdentity identityOf(const std::string& name);

// Whether two names are those of one file, by whatever spelling or link. A device is none.
bool isSameFile(const FileIdentity& a, const FileIdentity& b);
