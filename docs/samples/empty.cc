// Saves a store without records.
#include <korvex/framework/service/RecordFileManager.h>

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    RecordFileManager::instance()->setDBFile(argv[1]);
    RecordFileManager::instance()->saveToFile();
}
