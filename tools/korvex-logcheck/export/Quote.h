#pragma once

#include <string>

// A string in double quotes, for JSON and for YAML.
std::string jsonString(const std::string& text);

// The text in double quotes, with a backslash in front of quotes and backslashes.
std::string backslashed(const std::string& text);

// The text in single quotes, for YAML.
std::string yamlString(const std::string& text);
