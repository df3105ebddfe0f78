#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "crash-states/History.h"

namespace crashstates {

// What of one file may be on the disk. Its size, each of its blocks and each of its attributes
// reach the disk on their own, in any order, until a sync: each may have any version that it had
// since the last one. Where a block did not arrive that no version had before, it is zeros. A size
// that grows may stop at each bound of a block.
class FileModel {
  public:
    // All of `durable` is on the disk.
    FileModel(File durable, std::size_t blockSize);

    void write(std::uint64_t offset, const std::string& bytes);
    void truncate(std::uint64_t size);
    void setAttribute(const std::string& name, const std::optional<std::string>& value);
    void sync(bool dataOnly);

    // What programs see.
    const File& visible() const { return _visible; }
    // What may be on the disk, each once, what programs see as the last. Of each size no more
    // than `limit` combinations are looked at, or those of visitChoices; *complete becomes false
    // then, else it stays.
    std::vector<File> variants(std::size_t limit, bool& complete) const;

  private:
    using Value = std::optional<std::string>;

    struct Cell {  // something that reaches the disk whole or not at all
        enum Kind { BLOCK, ATTRIBUTE } kind;
        std::size_t block;            // its number
        std::string attribute;        // its name
        std::vector<Value> versions;  // each once, the newest last
    };

    std::size_t blocksOf(std::uint64_t size) const { return (size + _blockSize - 1) / _blockSize; }
    std::string visibleBlock(std::size_t block) const;
    void keepBlocks(std::size_t from, std::size_t end);
    std::vector<Cell> cellsOf(std::uint64_t size) const;
    std::string blockOnDisk(const std::string& version, std::size_t block,
                            std::uint64_t size) const;

    const std::size_t _blockSize;
    File _visible;
    // Versions since the last sync; the first is on the disk for certain.
    std::vector<std::uint64_t> _sizes;
    std::map<std::size_t, std::vector<std::string>> _blocks;
    std::map<std::string, std::vector<Value>> _attributes;
};

}  // namespace crashstates
