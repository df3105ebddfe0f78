#pragma once

#include <korvex/util/Pathname.h>

#include <string>
#include <vector>

#include "findings/Findings.h"

// Edits of findings of this text, applied. A finding whose edits meet those of an earlier one is
// left for the next time.
std::string applied(const std::string& bytes, const Findings& findings);

// The configuration with all that is surely a slip mended; checking it finds none of that again.
std::string mended(std::string bytes, const Pathname& home);
