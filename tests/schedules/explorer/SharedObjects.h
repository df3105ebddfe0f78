#pragma once

#include "explorer/Board.h"

namespace schedules {

// Finds the objects of a run that one thread changes and another one uses.
class SharedObjects {
  public:
    // The thread uses it; true when it has turned out to be shared just now.
    bool use(const void* object, unsigned thread, bool changes);
    // The thread gives up the memory at that address; true as above.
    bool giveUp(const void* address, unsigned thread);

  private:
    struct Entry {
        const void* object;
        ThreadMask users;
        bool changed;
        bool told;
    };
    static bool add(Entry& entry, unsigned thread, bool changes);
    // The object's entry, or a free one where it would be; null: there is no room.
    Entry* find(const void* object);

    static constexpr unsigned kSize = 8192;
    Entry _entries[kSize];
};

}  // namespace schedules
