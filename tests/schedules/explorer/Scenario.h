#pragma once

#include <string>
#include <vector>

namespace schedules {

// What a run left behind.
struct Remains {
    int status;       // its exit status
    std::string dir;  // where it kept its files
    std::string err;  // its standard error

    std::string file(const std::string& name) const;  // a file's bytes; empty when there is none
    // The lines of a text, without their ends; what follows the last end counts as one.
    static std::vector<std::string> lines(const std::string& text);
};

// A few threads doing something small. body() runs as thread 0 of a new process, whose current
// directory is empty, and may end it by exit().
struct Scenario {
    const char* name;
    void (*body)();
    // In the explorer, after each run that ended well: what is wrong with what it left, or nothing.
    // Must leave no trace in the process: the next run begins as the first one did.
    std::string (*check)(const Remains& remains) = nullptr;
    // For scenarios that are there to be found wanting: a part of what must be said of one.
    const char* wanted = nullptr;
    unsigned wantedFrom = 0;  // preemptions; with fewer all must go well
};

std::vector<Scenario>& scenarios();

// One of these in each file of scenarios.
struct Register {
    Register(std::initializer_list<Scenario> more);
};

// Ends the run as failed unless it holds.
void require(bool condition, const char* what);

}  // namespace schedules
