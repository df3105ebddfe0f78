#pragma once

#include <functional>
#include <string>

#include "crash-states/History.h"

namespace crashstates {

struct Recording {
    History history;
    int status;  // the child's exit status
};

// Runs body in a child (see traceCalls) and records what it does to the files of one directory.
// Throws std::runtime_error when it did anything there that cannot be recorded (by memory mapping,
// symbolic links, directories ...): then what the recording says is not what the directory holds
// at the end. Needs Linux 5.3 and no emulator; only one thread of the child may write.
Recording record(const std::string& directory, const std::function<int()>& body);

}  // namespace crashstates
