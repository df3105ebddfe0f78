#pragma once

#include <cstddef>
#include <map>
#include <vector>

#include "crash-states/DirectoryModel.h"
#include "crash-states/FileModel.h"
#include "crash-states/History.h"

namespace crashstates {

// One directory with its files: what programs see of it, and what of it may be on the disk.
class Disk {
  public:
    // All of `durable` is on the disk. The block size is in bytes.
    Disk(const Directory& durable, std::size_t blockSize, NameOrder order);

    void apply(const Event& event);

    // What programs see: every file that has a name.
    Directory visible() const;
    const Names& visibleNames() const { return _directory.visible(); }
    const File& visibleFile(Inode inode) const { return _files.at(inode).visible(); }

    // What may be on the disk, see DirectoryModel and FileModel.
    const DirectoryModel& directory() const { return _directory; }
    const FileModel& file(Inode inode) const { return _files.at(inode); }

  private:
    struct Applier;

    const std::size_t _blockSize;
    DirectoryModel _directory;
    std::map<Inode, FileModel> _files;
};

}  // namespace crashstates
