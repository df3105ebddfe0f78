#pragma once

#include <korvex/util/Pathname.h>

#include "Options.h"

// Where the record file is: -f, or hashDb/data below KORVEX_DB. Throws Failure: USAGE when that
// variable is of no use, IO_ERROR when hashDb is missing and --create was not given.
Pathname recordFilePath(const Options& options);

// Makes the directory of that file, if it is missing and --create was given. Throws Failure
// IO_ERROR.
void makeRecordDirectory(const Options& options);
