#pragma once

#include <string_view>

// Standard output, whose loss is noticed: both throw std::runtime_error, "standard output: " and
// the reason.

void writeOutput(std::string_view bytes);
// Before the tool ends: all of it has gone where it should.
void finishOutput();
