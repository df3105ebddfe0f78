#pragma once

#include <cstddef>
#include <string_view>
#include <vector>

inline namespace korvex {

// Records in byte-wise order of their keys: sorted chunks of pointers, so that entering one in the
// middle moves no more than a chunk.
class KeyOrder {
  public:
    struct Place {
        std::size_t chunk;
        std::size_t index;
    };
    // The place of the first record whose key is not before this one.
    Place lowerBound(std::string_view key) const;
    bool isEnd(Place place) const { return place.chunk == _chunks.size(); }
    const char* at(Place place) const { return _chunks[place.chunk][place.index]; }
    Place next(Place place) const;

    // Inserts before the record at that place. Throws std::bad_alloc; then the order is unchanged.
    void insert(Place place, const char* record);
    void replace(Place place, const char* record) { _chunks[place.chunk][place.index] = record; }
    void erase(Place place);

  private:
    using Chunk = std::vector<const char*>;

    void split(std::size_t chunk);

    std::vector<Chunk> _chunks;  // none is empty
};

}  // namespace korvex
