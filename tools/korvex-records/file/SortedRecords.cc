#include "file/SortedRecords.h"

#include <algorithm>

SortedRecords::SortedRecords(StrictReader& reader, const std::string& prefix) {
    while (reader.next()) {
        if (reader.key().compare(0, prefix.size(), prefix) != 0) continue;
        const RecordFrame& frame = reader.frame();
        _records.push_back({_keys.size(), frame.keySize, frame.valueSize, frame.valueAt()});
        _keys += reader.key();
    }
    const auto before = [this](const Record& a, const Record& b) { return keyOf(a) < keyOf(b); };
    if (!std::is_sorted(_records.begin(), _records.end(), before)) {
        std::sort(_records.begin(), _records.end(), before);
    }
}

std::string_view SortedRecords::keyOf(const Record& record) const {
    return std::string_view(_keys).substr(record.key, record.keySize);
}
