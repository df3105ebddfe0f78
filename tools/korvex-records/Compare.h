#pragma once

#include <vector>

#include "RecordStore.h"

// Whether the file is, byte for byte, the version record and just these records.
bool fileHolds(const Pathname& file, const std::vector<RecordStore::Record>& records);
