#include "commands/Commands.h"
#include "commands/Report.h"
#include "file/Change.h"
#include "file/Input.h"
#include "text/DumpFormat.h"
#include "text/JsonFormat.h"

namespace {

// What makes the old file the one in memory, which was filled without it.
RecordMemory::Counts replacing(const OpenFile* old, const RecordMemory& memory) {
    RecordMemory::Counts counts;
    counts.added = memory.size();
    if (old == nullptr) return counts;
    StrictReader reader = old->reader();
    while (reader.next()) {
        if (!memory.has(reader.key())) {
            ++counts.removed;
            continue;
        }
        --counts.added;
        if (!memory.holds(reader.key(), reader.value())) ++counts.changed;
    }
    return counts;
}

}  // namespace

// Nothing is locked before the whole dump is there: whoever writes it may need the file.
Status runLoad(const Options& options, const std::vector<std::string>& arguments) {
    if (options.replace && options.keep) {
        throw Failure(USAGE, "load: --replace or --keep, not both");
    }
    LineInput dump(arguments.empty() ? "-" : arguments.front());
    RecordMemory::Counts counts;
    Change change;
    change.mayCreate = true;
    change.startsEmpty = options.replace;
    change.make = [&](RecordMemory& memory, const OpenFile* old) {
        dump.rewind();
        (options.json ? parseJson : parseDump)(
            dump, [&](const std::string& key, const std::string& value) {
                if (!options.keep || !memory.has(key)) memory.put(key, value);
            });
        counts = options.replace ? replacing(old, memory) : memory.counts();
        return old == nullptr || counts.added + counts.changed + counts.removed > 0;
    };
    changeRecordFile(options, change);
    reportChange(counts, options.dryRun);
    return DONE;
}
