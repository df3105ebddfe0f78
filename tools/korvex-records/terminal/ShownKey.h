#pragma once

#include <string>
#include <string_view>

// A key for whoever looks at standard output or standard error (fd): escaped, except that a UTF-8
// terminal gets characters that it can print as they are.
std::string shownKey(std::string_view key, int fd);

// How many columns of a terminal such a text takes.
std::size_t columnsTaken(std::string_view shown);
