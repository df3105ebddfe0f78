#pragma once

#include <string>

#include "Configuration.h"

struct Sample {
    std::string line;     // as it would be written
    std::string failure;  // what is wrong with the layout; empty: the line is there
};

// A message of now on the channel, at the least level that passes it and that a logger has a method
// for, laid out by the appender's layout.
Sample sampleLine(const LogAppender& appender, const std::string& channelName,
                  const LogChannel& channel);
