#pragma once

#include <cstddef>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "crash-states/Disk.h"
#include "crash-states/History.h"

namespace crashstates {

// What a power failure may leave of a directory.
struct State {
    struct Entry {
        Inode inode;
        const File* file;  // owned by the CrashStates; one for all equal files
    };

    std::map<std::string, Entry> names;
    std::size_t latest;  // the highest number of events after which it may be found
};

struct Bounds {
    std::size_t blockSize = 4096;         // bytes that a disk writes whole or not at all
    std::size_t combinations = 1U << 14;  // of one file's blocks, of the names, of the files
    NameOrder order = NameOrder::OF_EACH;
};

// Every state that a power failure after any number of a history's events may leave, each once.
class CrashStates {
  public:
    explicit CrashStates(const History& history, const Bounds& bounds = {});

    const std::vector<State>& all() const& { return _states; }
    const std::vector<State>& all() && = delete;  // they point into this
    // False where the bounds left something out.
    bool complete() const { return _complete; }
    // What programs see at the end.
    Directory visible() const { return _disk.visible(); }

  private:
    const std::vector<const File*>& variantsOf(Inode inode);
    void collect(std::size_t events);
    void collect(const Names& names, std::size_t events);
    void add(State&& state);

    const Bounds _bounds;
    bool _complete = true;
    Disk _disk;
    std::map<Inode, std::vector<const File*>> _variants;  // after the last event, as asked for
    std::set<File> _files;                                // owns them
    std::map<std::string, std::size_t> _known;            // the place of each in _states
    std::vector<State> _states;
};

}  // namespace crashstates
