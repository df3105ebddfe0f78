#pragma once

#include <string>
#include <string_view>

// Two lower-case hex digits a byte.
std::string toHex(std::string_view bytes);
void appendHex(std::string& out, std::string_view bytes);

// Appends the byte of two hex digits; false when they are none.
bool appendHexByte(std::string& out, char high, char low);

// Printable ASCII as it is, a backslash doubled, any other byte as a backslash and two hex digits.
std::string escaped(std::string_view bytes);
// The same, with another text for a backslash.
void appendEscaped(std::string& out, std::string_view bytes, std::string_view backslash = "\\\\");

// Each control character as a backslash and two hex digits a byte, all else as it is. For messages:
// a file's name may hold what a terminal obeys.
std::string withoutControls(std::string_view text);

// Appends what was escaped in either way; any byte but a backslash may stand for itself. False for
// a backslash with neither another one nor two hex digits behind it.
bool appendUnescaped(std::string& out, std::string_view text);
