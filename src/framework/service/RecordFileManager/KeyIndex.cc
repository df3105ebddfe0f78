#include "framework/service/RecordFileManager/KeyIndex.h"

#include "framework/service/RecordFileManager/RecordView.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

inline namespace korvex {

namespace {

constexpr std::size_t kWindow = 32;  // slots in which a record may lie
constexpr std::size_t kFewest = 32;  // slots; a power of two
constexpr char kErased = 0;          // its address stands where a record was

std::uint64_t mixed(std::uint64_t hash, std::uint64_t word) {
    hash = (hash ^ word) * 0x9E3779B97F4A7C15U;
    return hash ^ (hash >> 32);
}

// Calls visit(slot) for the slots in which a record may lie, one after the other, until it returns
// true; the slot's number, or the number of slots where it never did.
template <class Slots, class Visit>
std::size_t probe(Slots& slots, std::size_t hash, Visit visit) {
    const std::size_t mask = slots.size() - 1;
    std::size_t at = hash;
    for (std::size_t i = 0; i < std::min(kWindow, slots.size()); ++i, ++at) {
        if (visit(slots[at & mask])) return at & mask;
    }
    return slots.size();
}

bool hasKey(const char* slot, std::string_view key) {
    return slot != nullptr && slot != &kErased && RecordView(slot).key() == key;
}

}  // namespace

// Hashes eight bytes at a time. The last eight overlap those before.
std::size_t KeyIndex::hashOf(std::string_view key) {
    std::uint64_t word = 0;
    std::uint64_t hash = key.size();
    if (key.size() < sizeof word) {
        for (const char c : key)
            word = word << 8 | static_cast<unsigned char>(c);
    } else {
        for (std::size_t at = 0; at < key.size() - sizeof word; at += sizeof word) {
            std::memcpy(&word, key.data() + at, sizeof word);
            hash = mixed(hash, word);
        }
        std::memcpy(&word, key.data() + key.size() - sizeof word, sizeof word);
    }
    return static_cast<std::size_t>(mixed(mixed(hash, word), 0));
}

KeyIndex::Answer KeyIndex::find(std::string_view key) const {
    const std::size_t at = probe(_slots, hashOf(key), [key](const char* slot) {
        return slot == nullptr || hasKey(slot, key);
    });
    return at < _slots.size() ? Answer{_slots[at], true} : Answer{nullptr, _slots.empty()};
}

void KeyIndex::reset(std::size_t records) {
    std::size_t size = kFewest;
    while (size < 6 * records)  // so that most records are entered once, some twice
        size *= 2;
    std::vector<const char*> slots(size);
    _slots.swap(slots);
    _used = 0;
}

void KeyIndex::prefetch(std::size_t hash) const {
    if (!_slots.empty()) __builtin_prefetch(&_slots[hash & (_slots.size() - 1)]);
}

void KeyIndex::insert(std::size_t hash, const char* record) {
    const std::size_t at = probe(_slots, hash, [](const char* slot) { return slot == nullptr; });
    if (at == _slots.size()) return;
    _slots[at] = record;
    ++_used;
}

const char** KeyIndex::slotOf(std::string_view key) {
    const std::size_t at =
        probe(_slots, hashOf(key), [key](const char* slot) { return hasKey(slot, key); });
    return at < _slots.size() ? &_slots[at] : nullptr;
}

void KeyIndex::replace(std::string_view key, const char* record) {
    if (const char** const slot = slotOf(key)) *slot = record;
}

void KeyIndex::erase(std::string_view key) {
    if (const char** const slot = slotOf(key)) *slot = &kErased;
}

}  // namespace korvex
