#pragma once

#include <string>
#include <string_view>

// Two lower-case hex digits a byte.
std::string toHex(std::string_view bytes);

// Appends the byte of two hex digits; false when they are none.
bool appendHexByte(std::string& out, char high, char low);

// Printable ASCII as it is, a backslash doubled, any other byte as a backslash and two hex digits.
std::string escaped(std::string_view bytes);
