#pragma once

#include <sys/types.h>

#include <functional>
#include <string>
#include <utility>

#include "crash-states/CrashStates.h"
#include "crash-states/History.h"

namespace crashstates {

// By which a file system knows a file, until it is gone.
using FileId = std::pair<dev_t, ino_t>;

// Of what the path leads to. Throw std::runtime_error, so that a test fails.
FileId fileIdOf(const std::string& path);
std::string bytesOf(const std::string& path);
Attributes attributesOf(const std::string& path);

// A real directory, which holds only regular files. Each gets the number that numberOf says.
Directory readDirectory(const std::string& path,
                        const std::function<Inode(const FileId&)>& numberOf);

// Makes the directory hold just that state: files with their links, bytes, modes and extended
// attributes. Not their owners, who may be others only for root.
void makeDirectory(const State& state, const std::string& path);

}  // namespace crashstates
