#pragma once

#include <string_view>

// To standard output, out of the way of what shows the progress. Throws std::runtime_error when it
// is lost.
void write(std::string_view bytes);
