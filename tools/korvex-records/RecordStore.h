#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <string>
#include <vector>

#include "Options.h"
#include "Scan.h"

// The record file, as the tool's runs share it. Opening takes a lock beside it (FILE.lock), so that
// runs of the tool come one after the other. All reading and writing goes through
// RecordFileManager.
//
// RecordFileManager rewrites its file in place. So that FILE is whole at every moment, a change is
// saved to FILE.new, compared with memory there, and renamed to FILE, while a copy of the old one
// (FILE.copy) stands by. A run that is killed leaves the old FILE or the new one; its copy is put
// back by the next run only if FILE is damaged then, by whatever it may be.
class RecordStore {
  public:
    struct Record {
        std::string key;
        std::string value;
    };

    // Throws Failure as the tool's statuses say.
    explicit RecordStore(const Options& options);
    RecordStore(const RecordStore&) = delete;
    RecordStore& operator=(const RecordStore&) = delete;
    // Gives up a change that was not confirmed: the file is as it was.
    ~RecordStore();

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
    // Puts what was saved in the file's place if it holds just what memory does; throws Failure
    // IO_ERROR otherwise, the file being as it was.
    void confirm();

  private:
    void lock();
    void load();
    bool restoreCopy() const;
    bool replaceFile();
    bool holdsWhatMemoryHolds(const Pathname& saved) const;

    const Pathname _file;
    const Pathname _new;
    const Pathname _copy;
    const bool _force;
    bool _changing = false;
    ScopedFileDescriptor _lock;
    Scan _scan;
};

// Where the record file is: -f, or hashDb/data below KORVEX_DB. Throws Failure USAGE when that
// variable is of no use.
Pathname recordFilePath(const Options& options);
