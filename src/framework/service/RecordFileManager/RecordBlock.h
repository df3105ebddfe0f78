#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string_view>

inline namespace korvex {

struct FreeBlock {
    void operator()(char* p) const { std::free(p); }
};
using Block = std::unique_ptr<char, FreeBlock>;

// Zeroed memory. Null if there is none, but not for size 0. calloc(3) does not touch large blocks,
// so a damaged length costs address space, not memory.
Block newBlock(std::size_t size);

// A record in a block of its own, in the form of the file. Null if there is no memory, and for a
// key or a value whose length does not fit into 32 bits.
Block newRecord(std::string_view key, std::string_view value);
// The same with a value that is longer than its bytes: zero bytes follow them.
Block newRecord(std::string_view key, std::uint32_t valueSize, std::string_view valueBegin);

}  // namespace korvex
