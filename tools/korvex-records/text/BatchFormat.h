#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "Status.h"
#include "file/Input.h"

// What is to be done, a line each, parted by tabs: "put KEY VALUE" and "remove KEY". Keys and
// values are escaped as `list` shows keys; any byte but a control character may stand for itself.
// Empty lines, and those that begin with "#", are passed over.
struct BatchLine {
    std::uint64_t number = 0;  // of the line
    bool isPut = false;        // else it removes
    std::string key;
    std::string value;
};

// Hands on each line. Throws Failure USAGE, naming the line, for anything else, and IO_ERROR when
// reading fails.
void parseBatch(LineInput& in, const std::function<void(const BatchLine&)>& take);

// Ends the batch: "batch, line N: WHAT".
[[noreturn]] void failBatch(Status status, std::uint64_t line, const std::string& what);
