#include "../support/StoreRows.h"

#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>

namespace {

void release(void* p) {
    delete[] static_cast<char*>(p);
}

class Korvex {
  public:
    void open(const std::string& path) { _store.setDBFile(path); }

    void load() { _store.readFile(); }
    void hold(const bench::Map& all) {
        for (const auto& [key, value] : all)
            _store.put(key, data(value), false);
    }
    void save() { _store.saveToFile(); }
    std::size_t get(const std::string& key) {
        PersistentHashData found;
        _store.get(key, found);
        release(found._pData);
        return found._size;
    }
    std::size_t enumerate(const std::string& prefix) {
        std::vector<PersistentFullData> matches;
        _store.enumerate(prefix, matches);
        for (const PersistentFullData& match : matches) {
            release(match._pKey);
            release(match._pData);
        }
        return matches.size();
    }
    void putAndSave(const std::string& key, const std::string& value) {
        _store.put(key, data(value), true);
    }

  private:
    static PersistentHashData data(const std::string& value) {
        return {const_cast<char*>(value.data()), static_cast<std::uint32_t>(value.size())};
    }
    RecordFileManager& _store = *RecordFileManager::instance();
};

}  // namespace

int main(int argc, char** argv) {
    Logger::initialize();
    return bench::storeMain<Korvex>(argc, argv);
}
