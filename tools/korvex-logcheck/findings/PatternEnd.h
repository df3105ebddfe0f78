#pragma once

#include "findings/Findings.h"

// Where the "#" stands that begins a comment within a pattern: what follows still looks like one,
// and what comes before is none that is whole. Source::kNone: there is none.
std::size_t hashInPattern(const Source& source, const ConfigStatement& said);

// Whether the file's open comment begins in the line.
bool isCutByComment(const Source& source, const SourceLine& line);
