#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include "file/OpenFile.h"
#include "file/RecordMemory.h"

// A new record file, made beside where it belongs under a name that nobody else has, and put there
// when it is whole and on the disk. Should it not come to that, it goes with this object.
//
// It is locked as long as this object lives, so that others can tell whose maker was killed. All
// members throw Failure IO_ERROR.
class NewFile {
  public:
    explicit NewFile(const Pathname& directory);
    NewFile(const NewFile&) = delete;
    NewFile& operator=(const NewFile&) = delete;
    ~NewFile();

    // Saves there and compares what it holds then with memory. `target` is for messages.
    void save(const RecordMemory& memory, const Pathname& target);
    // Takes the place of the old file, with its owner, mode and extended attributes, unless that
    // has been changed meanwhile.
    void replace(OpenFile& old);
    // Gets a name of its own; false when there is a file of that name already.
    bool becomes(const Pathname& name);

  private:
    bool make();
    bool holdsJust(const RecordMemory& memory) const;
    void sync() const;

    const Pathname _directory;
    Pathname _name;
    ScopedFileDescriptor _fd;
    bool _isBeside = false;
};

// Removes what killed runs have left in the directory: only what is surely a new file of ours whose
// maker is gone. `recordFile` is the one that this run has locked, if any: a name of ours for that
// very file is left over as well.
void sweep(const Pathname& directory, const OpenFile* recordFile);

// The directory that the file is in.
Pathname directoryOf(const Pathname& file);

// Brings what was made or renamed in the directory to the disk, where the file system can. Throws
// Failure IO_ERROR.
void syncDirectory(const Pathname& directory);
