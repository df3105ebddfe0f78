#include "commands/Commands.h"
#include "commands/Report.h"
#include "file/Change.h"
#include "file/Input.h"
#include "text/BatchFormat.h"
#include "text/Escape.h"

// Nothing is locked before all lines are there: whoever writes them may need the file.
Status runBatch(const Options& options, const std::vector<std::string>& arguments) {
    LineInput lines(arguments.empty() ? "-" : arguments.front());
    RecordMemory::Counts counts;
    Change change;
    change.mayCreate = true;
    change.make = [&](RecordMemory& memory, const OpenFile* old) {
        lines.rewind();
        parseBatch(lines, [&](const BatchLine& line) {
            if (line.isPut) {
                memory.put(line.key, line.value);
            } else if (!memory.remove(line.key)) {
                failBatch(NOT_FOUND, line.number,
                          escaped(line.key) + ": no such key; nothing is changed");
            }
        });
        counts = memory.counts();
        return old == nullptr || memory.isChanged();
    };
    changeRecordFile(options, change);
    reportChange(counts, false);
    return DONE;
}
