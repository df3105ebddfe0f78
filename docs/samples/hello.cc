#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

#include <memory>
#include <string>

int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);  // logs by $KORVEX_HOME/etc/log-cmdline.cfg
    RecordFileManager& store = *RecordFileManager::instance();
    store.init(xml::node());  // reads $KORVEX_DB/hashDb/data
    PersistentHashData found;
    store.get("runs", found);
    const std::unique_ptr<char[]> value(static_cast<char*>(found._pData));
    const int runs = value ? std::stoi(std::string(value.get(), found._size)) : 0;
    Logger("hello").info("ran %d times before", runs);
    std::string next = std::to_string(runs + 1);
    store.put("runs", {next.data(), static_cast<std::uint32_t>(next.size())}, true);  // saved
}
