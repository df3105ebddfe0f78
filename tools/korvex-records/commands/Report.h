#pragma once

#include "file/RecordMemory.h"

// Says on standard output what a change did, or would do.
void reportChange(const RecordMemory::Counts& counts, bool isOnlyTried);
