#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "terminal/Output.h"
#include "text/Counted.h"
#include "text/Escape.h"

Status runCheck(const Options& options, const std::vector<std::string>&) {
    const OpenFile file(recordFilePath(options));
    StrictReader reader = file.reader();
    while (reader.next())
        continue;
    const Scan& found = reader.found();
    const std::string records = counted(found.records, "record");
    if (!found.whole()) {
        write(file.name() + ": damaged at offset " + std::to_string(found.offset) + " after " +
              records + ": " + found.fault + "\n");
        return DAMAGED;
    }
    const std::string version = found.version.empty()
                                    ? std::string("no version")
                                    : "version \"" + escaped(found.version) + "\"";
    write(file.name() + ": whole, " + version + ", " + records + ", " +
          counted(found.bytes, "byte") + "\n");
    return DONE;
}
