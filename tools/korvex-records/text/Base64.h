#pragma once

#include <string>
#include <string_view>

// Base 64 with the usual alphabet and with padding.
std::string toBase64(std::string_view bytes);
// Appends what was encoded so; false when that is not just what toBase64() gives.
bool appendBase64(std::string& out, std::string_view text);
