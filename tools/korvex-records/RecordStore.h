#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <cstdint>
#include <string>
#include <vector>

#include "Options.h"
#include "Scan.h"

// The record file, as the tool's runs share it. Opening takes a lock beside it (FILE.lock), so that
// runs of the tool come one after the other, and puts back the copy (FILE.copy) that a run left
// which was killed while it saved. All reading and writing goes through RecordFileManager.
class RecordStore {
  public:
    struct Record {
        std::string key;
        std::string value;
    };

    // Throws Failure as the tool's statuses say.
    explicit RecordStore(const Options& options);

    // What a strict scan found before anything was loaded.
    const Scan& scanned() const { return _scan; }
    const Pathname& file() const { return _file; }

    // False when the key is absent.
    bool get(const std::string& key, std::string& value) const;
    // In key order.
    std::vector<Record> enumerate(const std::string& prefix) const;

    // Begins a change: refuses a damaged file unless that was forced, and makes the copy.
    void beginChange();
    // In memory; throws Failure USAGE for a key that would not come back.
    void put(const std::string& key, const std::string& value);
    // Removes and saves; false when the key is absent. confirm() ends the change.
    bool remove(const std::string& key);
    // Saves and confirms.
    void save();
    // Looks whether the file now holds just what memory does. If it does not, puts the copy back
    // and throws Failure IO_ERROR.
    void confirm();

  private:
    void lock();
    void load(const Options& options);
    void restoreCopy();
    bool holdsWhatMemoryHolds() const;

    Pathname _file;
    Pathname _copy;
    bool _force;
    bool _hadFile = false;
    ScopedFileDescriptor _lock;
    Scan _scan;
};

// Where the record file is: -f, or hashDb/data below KORVEX_DB. Throws Failure USAGE when that
// variable is of no use.
Pathname recordFilePath(const Options& options);
