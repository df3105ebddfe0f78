#pragma once

#include <optional>
#include <string>
#include <vector>

#include "findings/Code.h"

// A file that is to be written, and renamed when it is rotated.
struct WantedFile {
    std::string name;
    bool rotates;
};

// What keeps it from being written; no code of paths: nothing does.
struct AccessProblem {
    std::size_t file;  // its index
    Code code;
    std::string message;
};

// Looks as the process is, and changes nothing.
std::vector<AccessProblem> accessProblems(const std::vector<WantedFile>& files);

// The same as another user, by a child process that becomes that user; for which only root has the
// right. Throws Failure when there is no such user or no right.
std::vector<AccessProblem> accessProblemsOf(const std::string& user,
                                            const std::vector<WantedFile>& files);
