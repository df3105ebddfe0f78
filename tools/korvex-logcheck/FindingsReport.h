#pragma once

#include <string>

#include "findings/Findings.h"

// "FILE:LINE:COLUMN: error: MESSAGE; did you mean "TEXT"? [CODE]", in colours where they are
// wanted.
void writeFindings(const std::string& file, const Findings& findings);
// The same as one text, without colours.
std::string findingsText(const std::string& file, const Findings& findings);
// "1 error, 2 warnings", or that there are none.
void writeSummary(const Findings& findings);

// One JSON object a line.
void writeJson(const std::string& file, const Findings& findings);

// All codes there are: name, severity, whether --fix mends them, meaning; tabs between them.
void writeCodes();
