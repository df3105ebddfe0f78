#pragma once

#include <korvex/util/Pathname.h>
#include <korvex/util/ThreadObj.h>

#include <map>
#include <set>
#include <string>

// How often each name was counted: in memory, and after a save also in the record store, as decimal
// text under "count/NAME". Any thread may use it; nothing else may use the store.
class Counters {
  public:
    // `directory` is where the record store keeps its file.
    explicit Counters(const Pathname& directory);
    // Makes the directory where there is none, and reads the counts. Once, at the start. `fresh`
    // starts from nothing and leaves the old file as data.old. Throws ComponentException when the
    // file is damaged beyond use.
    void load(bool fresh);
    // Counts the name. False when it is none, or a new one beyond the limit.
    bool add(const std::string& name);
    // Saves what has changed. A failure is logged and leaves the file as it was; the next save
    // tries again. Whether all is saved.
    bool save();

  private:
    bool replaceFile() KORVEX_REQUIRES(_mutex);

    const Pathname _directory;
    const Pathname _file;
    const Pathname _new;
    Mutex _mutex;  // guards the store, too
    std::map<std::string, unsigned long long> _counts KORVEX_GUARDED_BY(_mutex);
    std::set<std::string> _changed KORVEX_GUARDED_BY(_mutex);  // names, since the last save
};
