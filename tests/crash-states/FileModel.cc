#include "crash-states/FileModel.h"

#include <algorithm>
#include <set>
#include <utility>

#include "crash-states/Choices.h"

namespace crashstates {

namespace {

// The last of each stays, so that the newest is the last.
template <class T>
void keepEachOnce(std::vector<T>& versions) {
    std::set<T> seen;
    std::vector<T> kept;
    for (auto it = versions.rbegin(); it != versions.rend(); ++it) {
        if (seen.insert(*it).second) kept.push_back(*it);
    }
    versions.assign(kept.rbegin(), kept.rend());
}

}  // namespace

FileModel::FileModel(File durable, std::size_t blockSize)
    : _blockSize(blockSize), _visible(std::move(durable)) {
    sync(false);
}

std::string FileModel::visibleBlock(std::size_t block) const {
    const std::size_t from = block * _blockSize;
    return from < _visible.bytes.size() ? _visible.bytes.substr(from, _blockSize) : "";
}

// Adds what programs see in these blocks to their versions.
void FileModel::keepBlocks(std::size_t from, std::size_t end) {
    for (std::size_t block = from; block < end; ++block) {
        std::vector<std::string>& versions = _blocks[block];
        if (versions.empty()) versions.emplace_back();  // nothing there yet
        versions.push_back(visibleBlock(block));
    }
}

void FileModel::write(std::uint64_t offset, const std::string& bytes) {
    const std::uint64_t end = offset + bytes.size();
    const std::uint64_t oldSize = _visible.bytes.size();
    if (end > oldSize) _visible.bytes.resize(end);
    std::copy(bytes.begin(), bytes.end(),
              _visible.bytes.begin() + static_cast<std::ptrdiff_t>(offset));
    keepBlocks(offset / _blockSize, blocksOf(end));
    const std::uint64_t firstBound = blocksOf(std::max(oldSize, offset) + 1) * _blockSize;
    for (std::uint64_t size = firstBound; size < end; size += _blockSize)
        _sizes.push_back(size);
    if (end > oldSize) _sizes.push_back(end);
}

void FileModel::truncate(std::uint64_t size) {
    const std::uint64_t oldSize = _visible.bytes.size();
    _visible.bytes.resize(size);
    keepBlocks(std::min(size, oldSize) / _blockSize, blocksOf(oldSize));
    _sizes.push_back(size);
}

void FileModel::setAttribute(const std::string& name, const std::optional<std::string>& value) {
    std::vector<Value>& versions = _attributes[name];
    if (versions.empty()) versions.emplace_back();  // it had none
    versions.push_back(value);
    if (value) {
        _visible.attributes[name] = *value;
    } else {
        _visible.attributes.erase(name);
    }
}

void FileModel::sync(bool dataOnly) {
    _sizes = {_visible.bytes.size()};
    _blocks.clear();
    for (std::size_t block = 0; block < blocksOf(_visible.bytes.size()); ++block)
        _blocks[block] = {visibleBlock(block)};
    if (dataOnly) return;
    _attributes.clear();
    for (const auto& [name, value] : _visible.attributes)
        _attributes[name] = {value};
}

// A version of a block, as a file of that size shows it.
std::string FileModel::blockOnDisk(const std::string& version, std::size_t block,
                                   std::uint64_t size) const {
    const std::uint64_t left = size - block * _blockSize;
    std::string shown = version;
    shown.resize(std::min<std::uint64_t>(left, _blockSize));
    return shown;
}

std::vector<FileModel::Cell> FileModel::cellsOf(std::uint64_t size) const {
    std::vector<Cell> cells;
    for (std::size_t block = 0; block < blocksOf(size); ++block) {
        Cell cell{Cell::BLOCK, block, "", {}};
        const auto found = _blocks.find(block);
        if (found == _blocks.end()) cell.versions = {blockOnDisk("", block, size)};
        if (found != _blocks.end()) {
            for (const std::string& version : found->second)
                cell.versions.emplace_back(blockOnDisk(version, block, size));
        }
        cells.push_back(std::move(cell));
    }
    for (const auto& [name, versions] : _attributes)
        cells.push_back({Cell::ATTRIBUTE, 0, name, versions});
    for (Cell& cell : cells)
        keepEachOnce(cell.versions);
    return cells;
}

std::vector<File> FileModel::variants(std::size_t limit, bool& complete) const {
    std::vector<std::uint64_t> sizes = _sizes;
    keepEachOnce(sizes);
    std::vector<File> files;
    for (const std::uint64_t size : sizes) {
        const std::vector<Cell> cells = cellsOf(size);
        std::vector<std::size_t> counts;
        for (const Cell& cell : cells)
            counts.push_back(cell.versions.size());
        const bool all = visitChoices(counts, limit, [&](const Choice& choice) {
            File file;
            for (std::size_t i = 0; i < cells.size(); ++i) {
                const Value& version = cells[i].versions[choice[i]];
                if (cells[i].kind == Cell::BLOCK) {
                    file.bytes += *version;
                } else if (version) {
                    file.attributes[cells[i].attribute] = *version;
                }
            }
            files.push_back(std::move(file));
        });
        complete = complete && all;
    }
    keepEachOnce(files);
    return files;
}

}  // namespace crashstates
