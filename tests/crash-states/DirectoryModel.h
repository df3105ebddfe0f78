#pragma once

#include <cstddef>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "crash-states/History.h"

namespace crashstates {

// The changes of one directory's names reach the disk ...
enum class NameOrder {
    OF_EACH,  // in any order, but those of one name, or of one file, in theirs
    OF_ALL    // as they were made; file systems with a journal mostly do
};

// Which names of one directory may be on the disk. A change is there whole or not at all. Until the
// directory is synced any of the changes may be missing.
class DirectoryModel {
  public:
    // All of `durable` is on the disk.
    DirectoryModel(Names durable, NameOrder order);

    // Gives the file the name, which another file may have had until now.
    void enter(const std::string& name, Inode inode);
    void rename(const std::string& from, const std::string& to);
    void unlink(const std::string& name);
    void sync();

    // What programs see.
    const Names& visible() const { return _visible; }
    // What may be on the disk, each once. Where that is more than `limit`, only the changes up to
    // each, and all but each one and those that follow from it; *complete becomes false then, else
    // it stays.
    std::vector<Names> variants(std::size_t limit, bool& complete) const;

  private:
    struct Change {
        std::map<std::string, std::optional<Inode>> names;  // none: not there any more
        std::set<Inode> inodes;

        bool touchesWhat(const Change& other) const;  // a name or a file
    };
    using Arrived = std::vector<bool>;  // for each pending change

    void add(Change change);
    bool mayFollow(const Arrived& arrived, std::size_t change) const;
    bool findAll(Arrived& arrived, std::size_t limit, std::vector<Arrived>& found) const;
    std::vector<Arrived> someArrived() const;
    Names with(const Arrived& arrived) const;

    const NameOrder _order;
    Names _durable;
    Names _visible;
    std::vector<Change> _pending;
};

}  // namespace crashstates
