#pragma once

#include <cstddef>
#include <cstdlib>
#include <memory>

inline namespace korvex {

struct FreeBlock {
    void operator()(void* p) const { std::free(p); }
};
using Block = std::unique_ptr<void, FreeBlock>;

// Memory for a value of `size` bytes, zeroed; null when there is none. Never null for size 0, which
// is a value like any other. calloc(3) takes large blocks from the system untouched, so a damaged
// length costs address space, not memory.
Block newValueBlock(std::size_t size);

}  // namespace korvex
