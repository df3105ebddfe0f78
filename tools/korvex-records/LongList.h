#pragma once

#include <string>
#include <vector>

#include "RecordStore.h"

// The records for a person, in columns below a header: the value's size, the key, and as much of
// the value as fits into so many columns.
std::string longList(const std::vector<RecordStore::Record>& records, std::size_t columns);
