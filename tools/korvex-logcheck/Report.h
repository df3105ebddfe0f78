#pragma once

#include <string>

#include "Findings.h"

// Each writes its part to standard output.

// The root, each category and each appender with a sample line.
void reportAll(const Configuration& config);
// Where a message of each level lands that is logged on this channel.
void reportChannel(const Configuration& config, const std::string& name);
// "FILE:LINE: error: ..." and the like, and how many there are of each.
void reportFindings(const Pathname& file, const Findings& findings);
