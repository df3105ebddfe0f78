#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "Status.h"
#include "file/FileWindow.h"
#include "file/KeysSoFar.h"
#include "file/RecordFrame.h"

// What a strict look at a record file found. Stricter than loading, which keeps what it can: here a
// fault is whatever a load and a save would not bring back as it is.
struct Scan {
    std::string version;        // of the version record; empty without one
    std::uint64_t records = 0;  // before the first fault, without the version record
    std::uint64_t bytes = 0;    // the file's size
    std::uint64_t offset = 0;   // of the record with the first fault
    std::string fault;          // its reason; empty: there is none

    bool whole() const { return fault.empty(); }
};

// Reads a record file, record by record in the file's order, up to the first fault.
class StrictReader {
  public:
    // The descriptor, of a regular file of so many bytes, stays the caller's.
    StrictReader(int fd, std::uint64_t size, const std::string& name);

    // The next record; false at the end or at the first fault. Throws Failure IO_ERROR.
    bool next();
    // Of the present record:
    const std::string& key() const { return _key; }
    const RecordFrame& frame() const { return _frame; }
    // It is read only if it is asked for; the bytes are there until the next call.
    std::string_view value() { return _file.at(_frame.valueAt(), _frame.valueSize); }

    const std::string& name() const { return _file.name(); }
    // All of it is known when next() was false.
    const Scan& found() const { return _found; }

  private:
    bool accept();
    bool isNew();

    const int _fd;
    FileWindow _file;
    std::uint64_t _at = 0;
    RecordFrame _frame;
    std::string _key;
    KeysSoFar _keys;
    Scan _found;
};

// What was asked for, unless the file it comes from is damaged: that must not go unsaid.
Status unlessDamaged(const StrictReader& reader, Status status);
// "FILE: damaged at offset N: what is wrong".
std::string damage(const std::string& name, const Scan& found);
