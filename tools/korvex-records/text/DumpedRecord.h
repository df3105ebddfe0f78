#pragma once

#include <functional>
#include <string>

// Is given each record of a dump. What it throws ends the parsing.
using DumpedRecordTaker = std::function<void(const std::string& key, const std::string& value)>;
