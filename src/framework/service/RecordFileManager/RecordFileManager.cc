#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>

#include "base/NeverDestroyed.h"
#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/StoreLogger.h"
#include "framework/service/RecordFileManager/ValueBlock.h"

#include <pthread.h>

#include <algorithm>
#include <cstring>

inline namespace korvex {

RecordFileManager* RecordFileManager::__pInstance = nullptr;

Logger& storeLogger() {
    static NeverDestroyed<Logger> logger("recordFileManager");
    return *logger;
}

namespace {

// Makes the logger exist, and wait for its channel, from start-up on.
[[maybe_unused]] const Logger& builtAtStartUp = storeLogger();

char* copyOf(const void* from, std::size_t size, std::size_t allocated) {
    char* const copy = new char[allocated];
    if (size > 0) std::memcpy(copy, from, size);
    return copy;
}

}  // namespace

Block newValueBlock(std::size_t size) {
    return Block(std::calloc(std::max<std::size_t>(size, 1), 1));
}

RecordFileManager* RecordFileManager::instance() {
    if (__pInstance == nullptr) {
        __pInstance = new RecordFileManager;
        keepLockThroughForks();
    }
    return __pInstance;
}

// A child of fork(2) would find the lock as another thread held it, and nobody to free it. The
// logging system's locks may be taken under this one, so before a fork this one must come first:
// what pthread_atfork(3) is told last runs first then.
void RecordFileManager::keepLockThroughForks() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    const auto take = []() KORVEX_NO_THREAD_SAFETY_ANALYSIS { __pInstance->_mutex.NOLOG_lock(); };
    const auto free = []() KORVEX_NO_THREAD_SAFETY_ANALYSIS { __pInstance->_mutex.NOLOG_unlock(); };
    static_cast<void>(pthread_atfork(take, free, free));
}

RecordFileManager::~RecordFileManager() noexcept(false) = default;

void RecordFileManager::setDBFile(Pathname path) {
    dbHomePath = std::move(path);
}

void RecordFileManager::init(const xml::node& /*node*/) {
    setDBFile(LoaderInfo::getInstance()->getKorvexDb() / "hashDb/data");
    readFile();
}

void RecordFileManager::put(const std::string& key, const PersistentHashData& data,
                            bool writeToFile) {
    const ScopedMutex lock(_mutex);
    if (key == VERSION_KEY) {
        storeLogger().error("Someone attempted to add internal version key to map - refusing.");
        return;
    }
    Block block = newValueBlock(data._size);
    if (!block) {
        throw ComponentException(storeLogger(),
                                 "Unable to allocate memory for storing hash value.");
    }
    if (data._size > 0) std::memcpy(block.get(), data._pData, data._size);
    insert(key, data._size, block.get());
    static_cast<void>(block.release());
    if (writeToFile) saveToFile();
}

// A replaced block is not freed: callers are known to hold on to values longer than the store does.
void RecordFileManager::insert(std::string key, std::uint32_t size, void* block) {
    // Files lie in key order, so while loading the place is the end.
    records.try_emplace(records.end(), std::move(key))->second = {size, block};
}

void RecordFileManager::get(const std::string& key, PersistentHashData& dataToReturn) const {
    const auto found = records.find(key);
    if (found == records.end()) {
        dataToReturn._pData = nullptr;
        return;
    }
    const auto& [size, block] = found->second;
    dataToReturn._pData = copyOf(block, size, size);
    dataToReturn._size = size;
}

bool RecordFileManager::remove(const std::string& key) {
    const auto found = records.find(key);
    if (found == records.end()) return false;
    std::free(found->second.second);
    records.erase(found);
    saveToFile();
    return true;
}

bool RecordFileManager::enumerate(const std::string& partialKey,
                                  std::vector<PersistentFullData>& listToReturn) const {
    bool matched = false;
    for (auto it = records.lower_bound(partialKey); it != records.end(); ++it) {
        const auto& [key, value] = *it;
        if (key.compare(0, partialKey.size(), partialKey) != 0) break;
        std::unique_ptr<char[]> data(copyOf(value.second, value.first, value.first));
        std::unique_ptr<char[]> name(copyOf(key.c_str(), key.size() + 1, key.size() + 1));
        PersistentFullData full;
        full._pData = data.get();
        full._dataSize = value.first;
        full._pKey = name.get();
        full._keySize = static_cast<std::uint32_t>(key.size());
        listToReturn.push_back(full);
        static_cast<void>(data.release());
        static_cast<void>(name.release());
        matched = true;
    }
    return matched;
}

}  // namespace korvex
