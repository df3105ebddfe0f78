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

// Zeroed memory; null when there is none, never for size 0. calloc(3) takes large blocks from the
// system untouched, so a damaged length costs address space, not memory.
Block newBlock(std::size_t size);

// A record in a block of its own, in the file's form. Null when there is no memory, as for a key or
// a value whose length does not fit into the file's 32 bits.
Block newRecord(std::string_view key, std::string_view value);
// The same with a value that is longer than its bytes: zero bytes stand behind them.
Block newRecord(std::string_view key, std::uint32_t valueSize, std::string_view valueBegin);

}  // namespace korvex
