#pragma once

#include <string_view>

// Standard output, whose loss is noticed: both throw Failure IO_ERROR.

void write(std::string_view bytes);
// Before the tool ends: all of it has gone where it should.
void finishOutput();
