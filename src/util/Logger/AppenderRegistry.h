#pragma once

#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/Logger/LogFormat.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

inline namespace korvex {

using LogAppenderMap = std::map<std::string, std::unique_ptr<LogAppender>>;

// Every appender made by name; never destroyed. Filled during start-up, so without a lock.
LogAppenderMap& appenders();

using LayoutList = std::vector<std::unique_ptr<const LogFormat>>;

// Every layout made for an appender; shared with threads that may be writing, so one that was
// replaced stays.
LayoutList& layouts();

}  // namespace korvex
