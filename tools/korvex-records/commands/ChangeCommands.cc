#include <unistd.h>

#include <set>

#include "commands/Commands.h"
#include "file/Change.h"
#include "file/Input.h"
#include "file/RecordFrame.h"
#include "terminal/ShownKey.h"
#include "text/Escape.h"

namespace {

std::string valueToPut(const Options& options, const std::vector<std::string>& arguments) {
    const int ways =
        (options.input ? 1 : 0) + (options.value ? 1 : 0) + static_cast<int>(arguments.size()) - 1;
    if (ways != 1) throw Failure(USAGE, "put: KEY VALUE, KEY -, --value TEXT KEY, or -i FILE KEY");
    if (options.value) return *options.value;
    if (options.input) return readInput(*options.input);
    return arguments[1] == "-" ? readInput("-") : arguments[1];
}

}  // namespace

// The value is there before anything is locked: whoever writes to standard input may need the file.
Status runPut(const Options& options, const std::vector<std::string>& arguments) {
    const std::string key = keyOf(arguments.front(), options);
    if (isRefusedKey(key)) {
        throw Failure(USAGE, "refused key \"" + escaped(key) + "\": it would not survive a reload");
    }
    const std::string value = valueToPut(options, arguments);
    Change change;
    change.mayCreate = true;
    change.make = [&](RecordMemory& memory, const OpenFile*) {
        memory.put(key, value);
        return true;
    };
    changeRecordFile(options, change);
    return DONE;
}

Status runRemove(const Options& options, const std::vector<std::string>& arguments) {
    std::set<std::string> keys;
    for (const std::string& argument : arguments)
        keys.insert(keyOf(argument, options));
    Status status = DONE;
    Change change;
    change.make = [&](RecordMemory& memory, const OpenFile*) {
        for (const std::string& key : keys) {
            if (memory.remove(key)) continue;
            complain(shownKey(key, STDERR_FILENO) + ": no such key");
            status = NOT_FOUND;
        }
        return memory.isChanged();
    };
    changeRecordFile(options, change);
    return status;
}
