// The record store in one program: put, get, enumerate, remove.
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

#include <cstdio>

static void put(const std::string& key, std::string value, bool save) {
    const PersistentHashData data{value.data(), static_cast<std::uint32_t>(value.size())};
    RecordFileManager::instance()->put(key, data, save);
}

int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);
    RecordFileManager& store = *RecordFileManager::instance();
    store.init(xml::node());

    put("fruit/apple", "red", false);        // in memory only
    put("fruit/pear", "", false);            // a value may be empty
    put("vegetable/leek", "green", true);    // saves all three
    put("_record-file-version", "9", true);  // refused

    PersistentHashData value;
    store.get("fruit/apple", value);
    std::printf("apple: %.*s\n", static_cast<int>(value._size), static_cast<char*>(value._pData));
    delete[] static_cast<char*>(value._pData);
    store.get("fruit/plum", value);
    std::printf("plum: %s\n", value._pData == nullptr ? "none" : "some");

    std::vector<PersistentFullData> fruit;
    store.enumerate("fruit/", fruit);
    for (const PersistentFullData& record : fruit) {
        std::printf("%s has %u bytes\n", static_cast<char*>(record._pKey), record._dataSize);
        delete[] static_cast<char*>(record._pKey);
        delete[] static_cast<char*>(record._pData);
    }

    const bool first = store.remove("vegetable/leek");  // saved at once
    const bool second = store.remove("vegetable/leek");
    std::printf("removed: %d, %d\n", first, second);
}
