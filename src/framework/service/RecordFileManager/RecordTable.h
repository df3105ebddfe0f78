#pragma once

#include "framework/service/RecordFileManager/KeyIndex.h"
#include "framework/service/RecordFileManager/KeyOrder.h"
#include "framework/service/RecordFileManager/RecordView.h"

#include <cstddef>
#include <string_view>

inline namespace korvex {

// Records by key, in byte-wise key order. It points at them, in the file's own form (RecordView),
// and owns none.
class RecordTable {
  public:
    std::size_t size() const { return _size; }
    // Null when the key is absent.
    const char* find(std::string_view key) const;
    // Enters a record. Returns the one whose place it took, with the same key, or null. Throws
    // std::bad_alloc, the table being as it was.
    const char* put(const char* record);
    // Takes the record out. It must be there.
    void erase(std::string_view key);

    // Calls visit(RecordView) for the records whose keys begin with the prefix, in key order, for
    // as long as it returns true. The table must not be changed meanwhile.
    template <class Visit>
    void walk(std::string_view prefix, Visit visit) const {
        for (auto at = _order.lowerBound(prefix); !_order.isEnd(at); at = _order.next(at)) {
            const RecordView record(_order.at(at));
            if (record.key().compare(0, prefix.size(), prefix) != 0 || !visit(record)) return;
        }
    }

  private:
    void enlargeIndex();
    bool isAt(KeyOrder::Place place, std::string_view key) const;

    KeyOrder _order;
    KeyIndex _index;
    std::size_t _size = 0;
};

}  // namespace korvex
