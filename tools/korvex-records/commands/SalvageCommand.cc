#include <unistd.h>

#include "commands/Commands.h"
#include "file/Change.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "file/Salvage.h"
#include "terminal/Output.h"
#include "text/Counted.h"

namespace {

std::string described(const Gap& gap) {
    std::string gone = "no record is surely gone";
    if (gap.gone > 0)
        gone = (gap.isExact ? "" : "at least ") + counted(gap.gone, "record") + " gone";
    return "gap at offset " + std::to_string(gap.offset) + ": " + counted(gap.bytes, "byte") +
           ", " + gone + ": " + gap.reason + "\n";
}

void refusePresent(const Pathname& output) {
    if (isThere(output)) throw Failure(IO_ERROR, output + ": is there already; not written to");
}

// The records of another version may mean something else in a file of this one.
void refuseOtherVersion(const OpenFile& file) {
    StrictReader reader = file.reader();
    static_cast<void>(reader.next());
    requireOwnVersion(file.name(), reader.found().version);
}

}  // namespace

Status runSalvage(const Options& options, const std::vector<std::string>&) {
    const OpenFile file(recordFilePath(options));
    if (options.output) refusePresent(*options.output);
    if (options.output && !options.anyVersion) refuseOtherVersion(file);
    RecordMemory memory;
    std::uint64_t records = 0;
    std::uint64_t gaps = 0;
    Salvaging to;
    to.take = [&](const RecordFrame&, const std::string& key, std::string_view value) {
        if (options.output) memory.put(key, value);
        ++records;
    };
    to.tell = [&](const Gap& gap) {
        write(described(gap));
        ++gaps;
    };
    salvage(file.fd(), file.size(), file.name(), to);
    if (options.output) createRecordFile(*options.output, memory);
    write(counted(records, "record") + (options.output ? " salvaged, " : " can be salvaged, ") +
          counted(gaps, "gap") + "\n");
    return gaps == 0 ? DONE : DAMAGED;
}
