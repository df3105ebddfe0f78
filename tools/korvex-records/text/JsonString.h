#pragma once

#include <string>
#include <string_view>

// Appends the text, which is UTF-8, as a JSON string.
void appendJsonString(std::string& out, std::string_view text);

// Reads the JSON string at the beginning of `rest` and takes it away from there. Returns what is
// wrong with it; null when nothing is.
const char* readJsonString(std::string_view& rest, std::string& out);
