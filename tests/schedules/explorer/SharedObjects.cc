#include "explorer/SharedObjects.h"

#include <cstddef>

namespace schedules {

SharedObjects::Entry* SharedObjects::find(const void* object) {
    const auto address = reinterpret_cast<std::size_t>(object);
    std::size_t at = (address ^ address >> 13) * 0x9E3779B97F4A7C15U >> 40;
    for (unsigned tried = 0; tried < kSize; ++tried, ++at) {
        Entry& entry = _entries[at % kSize];
        if (entry.object == nullptr || entry.object == object) return &entry;
    }
    return nullptr;
}

bool SharedObjects::add(Entry& entry, unsigned thread, bool changes) {
    entry.users = static_cast<ThreadMask>(entry.users | bit(thread));
    entry.changed = entry.changed || changes;
    const bool shared = entry.changed && (entry.users & (entry.users - 1)) != 0;
    const bool news = shared && !entry.told;
    entry.told = shared;
    return news;
}

bool SharedObjects::use(const void* object, unsigned thread, bool changes) {
    Entry* const entry = find(object);
    if (entry == nullptr) return false;
    entry->object = object;
    return add(*entry, thread, changes);
}

bool SharedObjects::giveUp(const void* address, unsigned thread) {
    Entry* const entry = find(address);
    return entry != nullptr && entry->object == address && add(*entry, thread, true);
}

}  // namespace schedules
