#pragma once

#include <korvex/util/Pathname.h>

#include <cstdint>
#include <functional>
#include <string>

#include "Status.h"

// What a strict look at a record file found. Stricter than loading, which keeps what it can: here a
// fault is whatever a load and a save would not bring back as it is.
struct Scan {
    bool missing = false;       // there is no file
    std::string version;        // of the version record; empty without one
    unsigned long records = 0;  // before the first fault, without the version record
    std::uint64_t bytes = 0;    // the file's size
    std::uint64_t offset = 0;   // of the record with the first fault
    std::string fault;          // its reason; empty: there is none

    bool whole() const { return fault.empty(); }
};

// Whether a key does not survive a save and a load: it looks like the version's key, or holds a
// NUL.
bool isRefusedKey(const std::string& key);

// Is given each record before the first fault, in the file's order.
using RecordVisitor = std::function<void(const std::string& key, std::string&& value)>;

// Reads only. Throws Failure IO_ERROR when a file that is there cannot be read or is none.
Scan scan(const Pathname& file, const RecordVisitor& visit = {});

// What was asked for, unless the file it comes from is damaged: that must not go unsaid.
Status unlessDamaged(const Pathname& file, const Scan& scanned, Status status);
