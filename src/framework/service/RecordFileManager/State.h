#pragma once

#include <korvex/framework/service/RecordFileManager.h>

#include "framework/service/RecordFileManager/StoredRecords.h"

#include <string>

inline namespace korvex {

struct KORVEX_HIDDEN RecordFileManager::State {
    Pathname file;        // empty until set
    std::string version;  // as read from the file
    StoredRecords records;
};

}  // namespace korvex
