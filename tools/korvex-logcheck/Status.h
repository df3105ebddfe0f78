#pragma once

#include <stdexcept>

// How the tool ends.
enum Status {
    CLEAN = 0,
    WARNINGS = 1,
    ERRORS = 2  // parse errors; also a file that cannot be read, wrong usage, a lost output
};

// Ends the tool with ERRORS and a message on standard error.
class Failure : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};
