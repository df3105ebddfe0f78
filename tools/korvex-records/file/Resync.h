#pragma once

#include <cstdint>
#include <deque>

#include "file/FileWindow.h"
#include "file/RecordFrame.h"

// How the records go on behind a fault.
struct Resync {
    std::uint64_t next = 0;  // where the next record begins; the file's size: there is none
    std::size_t kept = 0;    // so many of the records before the fault are not in doubt
    unsigned gone = 0;       // so many records are surely gone
    bool isExact = false;    // and no others
};

// Finds the records again behind a fault at `at`, where `before` ends: what was read since the
// start of the file, the version's record included, or since the last gap.
//
// A place is believed to be a record's beginning if from there records follow on each other, in key
// order and behind the last key, to the very end of the file. Three of them are enough if a length
// has left its trace: of a record with one damaged length the other one still tells where the next
// record begins. By such a trace a place is also found in what was read before the fault: a damaged
// length may have led into the middle of things.
Resync resync(FileWindow& file, std::uint64_t at, const std::deque<RecordFrame>& before);
