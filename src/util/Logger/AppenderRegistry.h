#pragma once

#include <korvex/util/Logger/LogAppender.h>

#include <map>
#include <memory>
#include <string>

inline namespace korvex {

using LogAppenderMap = std::map<std::string, std::unique_ptr<LogAppender>>;

// Every appender made by name; never destroyed. Filled during start-up, so without a lock.
LogAppenderMap& appenders();

}  // namespace korvex
