#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "file/SortedRecords.h"
#include "support/TerminalQuery.h"
#include "terminal/LongList.h"
#include "terminal/Output.h"
#include "terminal/ShownKey.h"

namespace {

void writeLine(std::string_view key, std::uint32_t size, const Options& options) {
    static std::string line;
    line.clear();
    if (options.longList) {
        char column[16];
        std::snprintf(column, sizeof column, "%10u  ", size);
        line = column;
    }
    if (options.nulSeparated) {
        line += key;
        line += '\0';
    } else {
        line += shownKey(key, STDOUT_FILENO);
        line += '\n';
    }
    write(line);
}

}  // namespace

// Keys are held, values are not; one that is not shown is not even read.
Status runList(const Options& options, const std::vector<std::string>& arguments) {
    const std::string prefix = prefixOf(arguments, options);
    const OpenFile file(recordFilePath(options));
    StrictReader reader = file.reader();
    const SortedRecords sorted(reader, prefix);
    const bool inColumns = options.longList && !options.nulSeparated && isTerminal(STDOUT_FILENO);
    LongList columns(inColumns ? columnsOf(STDOUT_FILENO) : 0);
    FileWindow values(file.fd(), file.size(), file.name());
    for (const SortedRecords::Record& record : sorted.records()) {
        const std::string_view key = sorted.keyOf(record);
        if (!inColumns) {
            writeLine(key, record.valueSize, options);
            continue;
        }
        const std::uint64_t shown = std::min<std::uint64_t>(record.valueSize, columns.most());
        columns.add(shownKey(key, STDOUT_FILENO), record.valueSize,
                    values.at(record.valueAt, shown));
    }
    const bool found = !sorted.records().empty();
    if (inColumns && found) write(columns.text());
    return unlessDamaged(reader, found ? DONE : NOT_FOUND);
}
