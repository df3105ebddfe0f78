#pragma once

#include <stdexcept>
#include <string>

// How the tool ends. (255, no KORVEX_HOME, is the common set-up's.)
enum Status {
    DONE = 0,
    NOT_FOUND = 1,  // a key is absent, or nothing matched
    USAGE = 2,      // wrong usage, a refused key, an unusable KORVEX_DB or dump
    DAMAGED = 3,    // the record file is damaged
    IO_ERROR = 4    // a file cannot be opened, read or written, or the output was lost
};

// Ends the tool with a status and a message on standard error.
class Failure : public std::runtime_error {
  public:
    Failure(Status status, const std::string& message)
        : std::runtime_error(message), _status(status) {}

    Status status() const { return _status; }

  private:
    Status _status;
};

// "MESSAGE: what errno says".
std::string withErrno(const std::string& message);

// Writes "korvex-records: MESSAGE" to standard error, its control characters escaped.
void complain(const std::string& message);
