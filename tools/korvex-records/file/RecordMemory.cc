#include "file/RecordMemory.h"

#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>

#include <cerrno>
#include <limits>
#include <memory>
#include <vector>

#include "Status.h"
#include "file/RecordFrame.h"
#include "text/Escape.h"

namespace {

RecordFileManager& manager() {
    return *RecordFileManager::instance();
}

struct Copy {
    explicit Copy(const std::string& key) {
        manager().get(key, data);
        owner.reset(static_cast<char*>(data._pData));
    }
    std::string_view bytes() const { return {owner.get(), data._size}; }

    PersistentHashData data;
    std::unique_ptr<char[]> owner;  // null: the key is absent
};

}  // namespace

// A former attempt at the same change may have left some.
RecordMemory::RecordMemory() {
    std::vector<PersistentFullData> left;
    manager().enumerate("", left);
    for (const PersistentFullData& full : left) {
        const std::unique_ptr<char[]> key(static_cast<char*>(full._pKey));
        const std::unique_ptr<char[]> value(static_cast<char*>(full._pData));
        manager().remove({key.get(), full._keySize}, false);
    }
}

void RecordMemory::load(const Pathname& file, std::uint64_t count) {
    manager().setDBFile(file);
    try {
        manager().readFile();
    } catch (const ComponentException&) {  // logged; what has not come is noticed
    }
    _size += count;
}

bool RecordMemory::get(const std::string& key, std::string& value) const {
    const Copy copy(key);
    if (copy.owner) value = copy.bytes();
    return copy.owner != nullptr;
}

bool RecordMemory::has(const std::string& key) const {
    return Copy(key).owner != nullptr;
}

bool RecordMemory::holds(const std::string& key, std::string_view value) const {
    const Copy copy(key);
    return copy.owner && copy.bytes() == value;
}

void RecordMemory::put(const std::string& key, std::string_view value) {
    if (isRefusedKey(key)) {
        throw Failure(USAGE, "refused key \"" + escaped(key) + "\": it would not survive a reload");
    }
    if (value.size() > std::numeric_limits<std::uint32_t>::max()) {
        throw Failure(USAGE, "value too large: a record holds less than 4 GiB");
    }
    const Copy before(key);
    if (before.owner) {
        if (before.bytes() == value) return;
        manager().remove(key, false);  // put() alone would never free the value
        ++_counts.changed;
    } else {
        ++_counts.added;
        ++_size;
    }
    PersistentHashData data;
    data._pData = const_cast<char*>(value.data());
    data._size = static_cast<std::uint32_t>(value.size());
    manager().put(key, data, false);
}

bool RecordMemory::remove(const std::string& key) {
    if (!manager().remove(key, false)) return false;
    ++_counts.removed;
    --_size;
    return true;
}

bool RecordMemory::isChanged() const {
    return _counts.added + _counts.changed + _counts.removed > 0;
}

int RecordMemory::save(const Pathname& file) const {
    manager().setDBFile(file);
    errno = 0;
    manager().saveToFile();
    return errno;
}
