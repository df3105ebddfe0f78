#pragma once

#include <string_view>

// Colours on standard output, where they are wanted: on a terminal that knows them, unless the
// environment has a NO_COLOR that is not empty.
enum class Ink { PLAIN, TITLE, GOOD, WARNING, ERROR, QUIET };

// Throws std::runtime_error when standard output is lost.
void write(std::string_view text, Ink ink = Ink::PLAIN);
