#include "file/KeyHistory.h"

#include <cstdint>
#include <cstring>
#include <functional>

KeyHistory::KeyHistory() : _index(0, Hash{this}, Equal{this}) {}

std::size_t KeyHistory::Hash::operator()(std::size_t at) const {
    return std::hash<std::string_view>()(owner->keyAt(at));
}

bool KeyHistory::Equal::operator()(std::size_t a, std::size_t b) const {
    return owner->keyAt(a) == owner->keyAt(b);
}

std::string_view KeyHistory::keyAt(std::size_t at) const {
    std::uint32_t size = 0;
    std::memcpy(&size, _bytes.data() + at, sizeof size);
    return std::string_view(_bytes).substr(at + sizeof size, size);
}

std::size_t KeyHistory::append(std::string_view key) {
    const auto size = static_cast<std::uint32_t>(key.size());
    const std::size_t at = _bytes.size();
    _bytes.append(reinterpret_cast<const char*>(&size), sizeof size);
    _bytes.append(key);
    return at;
}

void KeyHistory::indexAll() {
    for (std::size_t at = 0; at < _bytes.size(); at += sizeof(std::uint32_t) + keyAt(at).size())
        _index.insert(at);
}

bool KeyHistory::add(std::string_view key) {
    const bool ascends = _bytes.empty() || key > keyAt(_last);
    if (_ascending && !ascends) {
        _ascending = false;
        indexAll();
    }
    _last = append(key);
    if (_ascending || _index.insert(_last).second) return true;
    _bytes.resize(_last);
    _last = 0;  // looked at no more
    return false;
}
