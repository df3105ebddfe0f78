#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);  // logs by $KORVEX_HOME/etc/log-cmdline.cfg
    RecordFileManager& store = *RecordFileManager::instance();
    store.init(xml::node());  // reads $KORVEX_DB/hashDb/data
    PersistentHashData runs;
    store.get("runs", runs);
    Logger("hello").info("ran %u times before", runs._size);
    delete[] static_cast<char*>(runs._pData);
    char marks[] = "||||||||";
    store.put("runs", {marks, runs._size < 8 ? runs._size + 1 : 8}, true);  // saved at once
}
