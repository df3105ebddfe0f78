#pragma once

#include <string>

#include "Configuration.h"

struct Sample {
    std::string line;     // as it would be written
    std::string failure;  // what is wrong with the layout; empty: the line is there
};

// What `failure` is when a layout pads something to a width of six digits and more.
constexpr const char* kTooWide = "asks for a width of six digits";

// A message of the 5th of March 2007, 14:03:09,007 by the clock on the wall, on the channel, at the
// least level that passes it and that a logger has a method for, laid out by the appender's layout;
// 2.5 seconds after logging was set up. So the same line comes each time.
Sample sampleLine(const LogAppender& appender, const std::string& channelName,
                  const LogChannel& channel);
