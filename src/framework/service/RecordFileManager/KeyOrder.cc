#include "framework/service/RecordFileManager/KeyOrder.h"

#include "framework/service/RecordFileManager/RecordView.h"

#include <algorithm>

inline namespace korvex {

namespace {

constexpr std::size_t kChunk = 512;  // records at most

bool isBefore(const char* record, std::string_view key) {
    return RecordView(record).key() < key;
}

}  // namespace

KeyOrder::Place KeyOrder::lowerBound(std::string_view key) const {
    // Files are in key order, so while a file is loaded the place is the end.
    if (_chunks.empty() || isBefore(_chunks.back().back(), key)) return {_chunks.size(), 0};
    const auto chunk =
        std::lower_bound(_chunks.begin(), _chunks.end(), key,
                         [](const Chunk& c, std::string_view k) { return isBefore(c.back(), k); });
    const auto record = std::lower_bound(chunk->begin(), chunk->end(), key, isBefore);
    return {static_cast<std::size_t>(chunk - _chunks.begin()),
            static_cast<std::size_t>(record - chunk->begin())};
}

KeyOrder::Place KeyOrder::next(Place place) const {
    if (place.index + 1 < _chunks[place.chunk].size()) return {place.chunk, place.index + 1};
    return {place.chunk + 1, 0};
}

void KeyOrder::insert(Place place, const char* record) {
    if (isEnd(place)) {
        if (_chunks.empty() || _chunks.back().size() == kChunk) {
            _chunks.push_back({record});
            return;
        }
        place = {_chunks.size() - 1, _chunks.back().size()};
    }
    if (_chunks[place.chunk].size() == kChunk) {
        split(place.chunk);
        if (place.index > kChunk / 2) place = {place.chunk + 1, place.index - kChunk / 2};
    }
    Chunk& chunk = _chunks[place.chunk];
    chunk.insert(chunk.begin() + static_cast<std::ptrdiff_t>(place.index), record);
}

// Splits a chunk into two halves.
void KeyOrder::split(std::size_t chunk) {
    const auto middle = _chunks[chunk].begin() + kChunk / 2;
    _chunks.emplace(_chunks.begin() + static_cast<std::ptrdiff_t>(chunk) + 1, middle,
                    _chunks[chunk].end());
    _chunks[chunk].resize(kChunk / 2);
}

void KeyOrder::erase(Place place) {
    Chunk& chunk = _chunks[place.chunk];
    chunk.erase(chunk.begin() + static_cast<std::ptrdiff_t>(place.index));
    if (chunk.empty()) _chunks.erase(_chunks.begin() + static_cast<std::ptrdiff_t>(place.chunk));
}

}  // namespace korvex
