#pragma once

#include <string>

// The names of the tool's new files. They are short whatever the record file's name is, because
// that may have all the 255 bytes that a name can have.
std::string inventNewFileName();
bool isNewFileName(const std::string& name);
