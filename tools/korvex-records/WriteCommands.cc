#include <sstream>

#include "Commands.h"
#include "DumpFormat.h"
#include "Escape.h"
#include "Input.h"
#include "Progress.h"
#include "RecordStore.h"

namespace {

std::string valueToPut(const Options& options, const std::vector<std::string>& arguments) {
    if (options.input.empty() == (arguments.size() == 1)) {
        throw Failure(USAGE, "put: KEY VALUE, KEY -, or -i FILE KEY");
    }
    if (!options.input.empty()) return readInputFile(options.input);
    return arguments[1] == "-" ? readStandardInput() : arguments[1];
}

}  // namespace

Status runPut(const Options& options, const std::vector<std::string>& arguments) {
    if (isRefusedKey(arguments.front())) {
        throw Failure(USAGE, "refused key: it would not survive a reload");
    }
    const std::string value = valueToPut(options, arguments);
    RecordStore store(options);
    store.beginChange();
    store.put(arguments.front(), value);
    store.save();
    return DONE;
}

Status runRemove(const Options& options, const std::vector<std::string>& arguments) {
    RecordStore store(options);
    Status status = DONE;
    bool changing = false;
    for (const std::string& key : arguments) {
        std::string ignored;
        if (!store.get(key, ignored)) {
            complain(escaped(key) + ": no such key");
            status = NOT_FOUND;
            continue;
        }
        if (!changing) store.beginChange();
        changing = true;
        store.remove(key);
    }
    if (changing) store.confirm();
    return status;
}

Status runLoad(const Options& options, const std::vector<std::string>& arguments) {
    const ProgressDisplay display;
    std::istringstream dump(arguments.empty() ? readStandardInput()
                                              : readInputFile(arguments.front()));
    progressStep("parsing", static_cast<std::uint64_t>(dump.rdbuf()->in_avail()));
    const Records records = parseDump(dump);
    for (const auto& record : records) {
        if (isRefusedKey(record.first)) {
            throw Failure(USAGE, "refused key \"" + escaped(record.first) +
                                     "\": it would not survive a reload");
        }
    }
    RecordStore store(options);
    store.beginChange();
    progressStep("storing", records.size());
    std::uint64_t stored = 0;
    for (const auto& [key, value] : records) {
        store.put(key, value);
        progressAt(++stored);
    }
    store.save();
    return DONE;
}
