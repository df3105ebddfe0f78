#pragma once

#include <korvex/util/Pathname.h>

#include <optional>
#include <string>

#include "Configuration.h"

// The engines' names and what is written for each, to standard output.
void listEngines();

// Writes the engine's configuration for the files of all appenders, or of the one that is named,
// to standard output. Throws Failure that says of each file what is in doubt; nothing is written
// then.
void exportTo(const std::string& engine, const Configuration& config, const Pathname& source,
              const std::optional<std::string>& appender);
