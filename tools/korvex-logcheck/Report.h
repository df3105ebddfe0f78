#pragma once

#include <string>

#include "Configuration.h"

// Each writes its part to standard output.

// The root, each category and each appender with a sample line.
void reportAll(const Configuration& config);
// Where a message of each level lands that is logged on this channel.
void reportChannel(const Configuration& config, const std::string& name);
