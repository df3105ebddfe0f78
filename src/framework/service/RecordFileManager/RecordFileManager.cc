#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>

#include "base/NeverDestroyed.h"
#include "framework/service/RecordFileManager/RecordFormat.h"
#include "framework/service/RecordFileManager/State.h"
#include "framework/service/RecordFileManager/StoreLogger.h"
#include "platform/AtFork.h"

#include <cstring>
#include <memory>
#include <utility>

inline namespace korvex {

RecordFileManager* RecordFileManager::__pInstance = nullptr;

Logger& storeLogger() {
    static NeverDestroyed<Logger> logger("recordFileManager");
    return *logger;
}

namespace {

// Creates the logger at start-up, so that it is bound when logging is initialised.
[[maybe_unused]] const Logger& builtAtStartUp = storeLogger();

// For a caller to free with delete[].
std::unique_ptr<char[]> copyOf(std::string_view bytes, std::size_t size) {
    std::unique_ptr<char[]> copy(new char[size]);
    if (!bytes.empty()) std::memcpy(copy.get(), bytes.data(), bytes.size());
    return copy;
}

void appendCopy(std::vector<PersistentFullData>& list, RecordView record) {
    const std::string_view key = record.key();
    const std::string_view value = record.value();
    std::unique_ptr<char[]> data = copyOf(value, value.size());
    std::unique_ptr<char[]> name = copyOf(key, key.size() + 1);
    name[key.size()] = '\0';
    PersistentFullData full;
    full._pData = data.get();
    full._dataSize = static_cast<std::uint32_t>(value.size());
    full._pKey = name.get();
    full._keySize = static_cast<std::uint32_t>(key.size());
    list.push_back(full);
    static_cast<void>(data.release());
    static_cast<void>(name.release());
}

}  // namespace

RecordFileManager::RecordFileManager() : _state(new State) {}

namespace {

// In a child of fork(2), the lock of the store would stay locked if another thread held it. So it
// is taken before a fork. It comes before the locks of the logging system, because these may be
// taken under it.
Mutex* storeLock = nullptr;  // null: there is no store yet
thread_local bool takenForFork = false;

void takeStoreLock() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    takenForFork = storeLock != nullptr && storeLock->NOLOG_lock();
}

void freeStoreLock() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    if (takenForFork) storeLock->NOLOG_unlock();
    takenForFork = false;
}

KORVEX_REGISTERS_STORE_LOCK void keepStoreLockThroughForks() {
    pthread_atfork(&takeStoreLock, &freeStoreLock, &freeStoreLock);
}

}  // namespace

RecordFileManager* RecordFileManager::instance() {
    if (__pInstance == nullptr) {
        __pInstance = new RecordFileManager;
        storeLock = &__pInstance->_mutex;
    }
    return __pInstance;
}

RecordFileManager::~RecordFileManager() noexcept(false) = default;

void RecordFileManager::setDBFile(Pathname path) {
    _state->file = std::move(path);
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
    enter(key, {static_cast<const char*>(data._pData), data._size});
    if (writeToFile) saveToFile();
}

void RecordFileManager::enter(std::string_view key, std::string_view value) {
    Block block = newRecord(key, value);
    if (!block) {
        throw ComponentException(storeLogger(),
                                 "Unable to allocate memory for storing hash value.");
    }
    _state->records.put(std::move(block));
}

void RecordFileManager::get(const std::string& key, PersistentHashData& dataToReturn) const {
    const char* const found = _state->records.table().find(key);
    if (found == nullptr) {
        dataToReturn._pData = nullptr;
        return;
    }
    const std::string_view value = RecordView(found).value();
    dataToReturn._pData = copyOf(value, value.size()).release();
    dataToReturn._size = static_cast<std::uint32_t>(value.size());
}

bool RecordFileManager::remove(const std::string& key) {
    return remove(key, true);
}

bool RecordFileManager::remove(const std::string& key, bool writeToFile) {
    if (!_state->records.remove(key)) return false;
    if (writeToFile) saveToFile();
    return true;
}

bool RecordFileManager::enumerate(const std::string& partialKey,
                                  std::vector<PersistentFullData>& listToReturn) const {
    bool matched = false;
    _state->records.table().walk(partialKey, [&](RecordView record) {
        appendCopy(listToReturn, record);
        return matched = true;
    });
    return matched;
}

}  // namespace korvex
