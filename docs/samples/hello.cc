#include <korvex/framework/service/StringStore.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);  // logs by $KORVEX_HOME/etc/log-cmdline.cfg
    StringStore store = StringStore::open();          // reads $KORVEX_DB/hashDb/data
    const int runs = std::stoi(store.get("runs").value_or("0"));
    Logger("hello").info("ran %d times before", runs);
    store.put("runs", std::to_string(runs + 1));
    return store.save() ? 0 : 1;
}
