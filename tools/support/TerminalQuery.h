#pragma once

#include <cstddef>

// Whether a descriptor is a terminal, so that a person looks at what goes there.
bool isTerminal(int fd);
// How many columns it has; 80 when it does not say.
std::size_t columnsOf(int fd);
