#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "terminal/Output.h"
#include "text/DumpFormat.h"
#include "text/JsonFormat.h"

namespace {

std::string end(const StrictReader& reader, bool json) {
    const Scan& found = reader.found();
    if (json) return found.whole() ? "" : jsonDamage(damage(reader.name(), found));
    return found.whole() ? dumpTrailer() : "";  // without it nobody takes the dump for whole
}

}  // namespace

Status runDump(const Options& options, const std::vector<std::string>& arguments) {
    if (options.json && options.print) throw Failure(USAGE, "dump: --json or --print, not both");
    const std::string prefix = prefixOf(arguments, options);
    const OpenFile file(recordFilePath(options));
    StrictReader reader = file.reader();
    if (!options.json) write(dumpHeader(options.print));
    bool any = false;
    std::string text;
    while (reader.next()) {
        if (!beginsWith(reader.key(), prefix)) continue;
        any = true;
        text.clear();
        if (options.json) {
            appendJsonLine(text, reader.key(), reader.value());
        } else {
            appendDumpLine(text, reader.key(), options.print);
            appendDumpLine(text, reader.value(), options.print);
        }
        write(text);
    }
    write(end(reader, options.json));
    return unlessDamaged(reader, any ? DONE : NOT_FOUND);
}
