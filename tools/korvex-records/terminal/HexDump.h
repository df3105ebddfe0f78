#pragma once

#include <string>
#include <string_view>

// Whether a terminal shows these bytes as they are meant: UTF-8 without control characters except
// tabs and line feeds. (A value must not move the cursor or program the keyboard.)
bool isText(std::string_view bytes);

// Sixteen bytes a line: the offset, the bytes as hex digits, and as characters where they are
// printable ASCII.
std::string hexDump(std::string_view bytes);
