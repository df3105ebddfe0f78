#pragma once

#include <cstddef>
#include <string_view>
#include <vector>

inline namespace korvex {

// Finds records by the hash of their key. A record lies within a few slots of where its hash
// points, or it is not here: so keys that somebody made to collide cost a search elsewhere and no
// more, and the hash needs no secret.
class KeyIndex {
  public:
    static std::size_t hashOf(std::string_view key);

    struct Answer {
        const char* record;  // null where there is none
        bool known;          // false: the record may be elsewhere
    };
    Answer find(std::string_view key) const;

    // Whether one more can be entered; else all must be, again, behind a reset.
    bool hasRoom() const { return 2 * (_used + 1) <= _slots.size(); }
    // Empty, with room for so many records. Throws std::bad_alloc, the index being as it was.
    void reset(std::size_t records);
    // Asks for the memory that an insert will look at, which shortens loading a million records by
    // a third.
    void prefetch(std::size_t hash) const;
    // Enters a record whose key has that hash and is not there; there must be room.
    void insert(std::size_t hash, const char* record);
    // The record with this key is another one now.
    void replace(std::string_view key, const char* record);
    void erase(std::string_view key);

  private:
    const char** slotOf(std::string_view key);

    std::vector<const char*> _slots;  // as many as a power of two; null where never used
    std::size_t _used = 0;            // slots that are not null
};

}  // namespace korvex
