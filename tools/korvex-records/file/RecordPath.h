#pragma once

#include <korvex/util/Pathname.h>

#include "Options.h"

// Where the record file is: -f, or hashDb/data below KORVEX_DB. With --create a missing hashDb is
// made. Throws Failure: USAGE when that variable is of no use, IO_ERROR when hashDb is missing.
Pathname recordFilePath(const Options& options);
