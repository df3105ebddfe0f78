#pragma once

#include <cerrno>
#include <string>
#include <system_error>

// What cannot be done, and why errno says so.
inline std::system_error systemFailure(const std::string& what) {
    return {errno, std::generic_category(), what};
}
