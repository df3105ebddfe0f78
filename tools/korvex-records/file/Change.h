#pragma once

#include <functional>

#include "Options.h"
#include "file/OpenFile.h"
#include "file/RecordMemory.h"

// A change to the record file, made in memory.
struct Change {
    // Changes what is in memory; whether that is to be saved. May be called again, from the start,
    // when another run was first. `old` is null when there is no file.
    std::function<bool(RecordMemory& memory, const OpenFile* old)> make;
    bool mayCreate = false;    // else a missing file is refused
    bool startsEmpty = false;  // the old records are not loaded
};

// Makes the change while no other run does: the record file is what it was, or holds it whole. With
// --dry-run nothing is locked or saved. Throws Failure.
void changeRecordFile(const Options& options, const Change& change);

// Throws Failure IO_ERROR unless the file is of the version that is written, or of none.
void requireOwnVersion(const Pathname& name, const std::string& version);

// Makes a record file of what is in memory. Throws Failure IO_ERROR, also when there is a file of
// that name.
void createRecordFile(const Pathname& name, const RecordMemory& memory);
