#pragma once

#include <string_view>

// Colours on standard output, where they are wanted: on a terminal that knows them, unless the
// environment has a NO_COLOR that is not empty.
enum class Ink { PLAIN, TITLE, GOOD, WARNING, ERROR, QUIET };

// Both throw Failure when standard output is lost.

void write(std::string_view text, Ink ink = Ink::PLAIN);
// Before the tool ends: all of it has gone where it should.
void finishOutput();
