// The record store with strings: get, put, list, remove, save.
#include <korvex/framework/service/StringStore.h>
#include <korvex/util/LoaderInfo.h>

#include <cstdio>

int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);
    StringStore store = StringStore::open();  // reads $KORVEX_DB/hashDb/data

    store.put("fruit/apple", "red");  // in memory only
    store.put("fruit/pear", "");      // a value may be empty
    store.put("vegetable/leek", "green");

    std::printf("apple: %s\n", store.get("fruit/apple").value_or("none").c_str());
    std::printf("plum: %s\n", store.get("fruit/plum").value_or("none").c_str());
    for (const auto& [key, value] : store.list("fruit/"))
        std::printf("%s has %zu bytes\n", key.c_str(), value.size());

    const bool first = store.remove("vegetable/leek");
    const bool second = store.remove("vegetable/leek");
    std::printf("removed: %d, %d\n", first, second);

    if (!store.save()) std::perror("cannot save");  // all of it, in one file
}
