#include "framework/service/RecordFileManager/RecordTable.h"

inline namespace korvex {

bool RecordTable::isAt(KeyOrder::Place place, std::string_view key) const {
    return !_order.isEnd(place) && RecordView(_order.at(place)).key() == key;
}

const char* RecordTable::find(std::string_view key) const {
    const KeyIndex::Answer answer = _index.find(key);
    if (answer.known) return answer.record;
    const KeyOrder::Place place = _order.lowerBound(key);
    return isAt(place, key) ? _order.at(place) : nullptr;
}

const char* RecordTable::put(const char* record) {
    const std::string_view key = RecordView(record).key();
    const std::size_t hash = KeyIndex::hashOf(key);
    _index.prefetch(hash);
    const KeyOrder::Place place = _order.lowerBound(key);
    if (isAt(place, key)) {
        const char* const old = _order.at(place);
        _order.replace(place, record);
        _index.replace(key, record);
        return old;
    }
    if (!_index.hasRoom()) enlargeIndex();
    _order.insert(place, record);
    _index.insert(hash, record);
    ++_size;
    return nullptr;
}

void RecordTable::enlargeIndex() {
    _index.reset(_size + 1);
    walk("", [this](RecordView record) {
        _index.insert(KeyIndex::hashOf(record.key()), record.begin());
        return true;
    });
}

void RecordTable::erase(std::string_view key) {
    _index.erase(key);
    _order.erase(_order.lowerBound(key));
    --_size;
}

}  // namespace korvex
