#pragma once

#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/Logger/LogFormat.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

inline namespace korvex {

using LogAppenderMap = std::map<std::string, std::unique_ptr<LogAppender>>;

// All appenders made by name; never destroyed. They are made during start-up, so there is no lock.
LogAppenderMap& appenders();

using LayoutList = std::vector<std::unique_ptr<const LogFormat>>;

// All layouts made for appenders. Other threads may be using one, so a layout that was replaced is
// kept.
LayoutList& layouts();

}  // namespace korvex
