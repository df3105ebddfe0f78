// Reads a damaged record file and shows what is left.
#include <korvex/framework/service/RecordFileManager.h>

#include <cstdio>

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    RecordFileManager& store = *RecordFileManager::instance();
    store.setDBFile(argv[1]);
    try {
        store.readFile();
    } catch (const std::exception& e) {
        std::printf("exception: %s\n", e.what());
    }
    std::vector<PersistentFullData> all;
    store.enumerate("", all);
    for (const PersistentFullData& record : all) {
        std::printf("%s:", static_cast<char*>(record._pKey));
        for (std::uint32_t i = 0; i < record._dataSize; ++i)
            std::printf(" %02x", static_cast<unsigned char*>(record._pData)[i]);
        std::printf("\n");
        delete[] static_cast<char*>(record._pKey);
        delete[] static_cast<char*>(record._pData);
    }
}
