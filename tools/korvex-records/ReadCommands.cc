#include <unistd.h>

#include <cstdio>

#include "Commands.h"
#include "DumpFormat.h"
#include "Escape.h"
#include "HexDump.h"
#include "LongList.h"
#include "Output.h"
#include "Progress.h"
#include "RecordStore.h"
#include "support/TerminalQuery.h"

namespace {

std::string prefixOf(const std::vector<std::string>& arguments) {
    return arguments.empty() ? "" : arguments.front();
}

std::string listed(const RecordStore::Record& record, const Options& options) {
    std::string line;
    if (options.longList) {
        char size[16];
        std::snprintf(size, sizeof size, "%10zu  ", record.value.size());
        line = size;
    }
    if (options.nulSeparated) return line + record.key + '\0';
    return line + escaped(record.key) + '\n';
}

void writeValue(const std::string& value, const Options& options) {
    if (options.hex) {
        write(toHex(value) + "\n");
    } else if (isTerminal(STDOUT_FILENO) && !isText(value)) {
        write(hexDump(value));
    } else {
        write(value);
    }
}

}  // namespace

Status runList(const Options& options, const std::vector<std::string>& arguments) {
    const RecordStore store(options);
    const auto records = store.enumerate(prefixOf(arguments));
    if (options.longList && !options.nulSeparated && isTerminal(STDOUT_FILENO)) {
        write(records.empty() ? "" : longList(records, columnsOf(STDOUT_FILENO)));
    } else {
        for (const auto& record : records)
            write(listed(record, options));
    }
    return unlessDamaged(store.file(), store.scanned(), records.empty() ? NOT_FOUND : DONE);
}

Status runGet(const Options& options, const std::vector<std::string>& arguments) {
    const RecordStore store(options);
    std::string value;
    const bool found = store.get(arguments.front(), value);
    if (!found) complain(escaped(arguments.front()) + ": no such key");
    if (found) writeValue(value, options);
    return unlessDamaged(store.file(), store.scanned(), found ? DONE : NOT_FOUND);
}

Status runDump(const Options& options, const std::vector<std::string>& arguments) {
    const ProgressDisplay display;
    const RecordStore store(options);
    const auto records = store.enumerate(prefixOf(arguments));
    progressStep("writing", records.size());
    write(dumpHeader(options.print));
    std::uint64_t written = 0;
    for (const auto& record : records) {
        write(dumpLine(record.key, options.print));
        write(dumpLine(record.value, options.print));
        progressAt(++written);
    }
    write(dumpTrailer());
    return unlessDamaged(store.file(), store.scanned(), records.empty() ? NOT_FOUND : DONE);
}

// Takes no lock and restores no copy: it changes nothing at all.
Status runCheck(const Options& options, const std::vector<std::string>&) {
    const ProgressDisplay display;
    const Pathname file = recordFilePath(options);
    const Scan scanned = scan(file);
    if (scanned.missing) throw Failure(IO_ERROR, file + ": no such file");
    if (Pathname(file + ".copy").exists()) {
        complain(file + ".copy is there: a run was cut off while it saved; should " + file +
                 " be damaged, the next one restores it");
    }
    const std::string count = std::to_string(scanned.records) + " records";
    if (!scanned.whole()) {
        write(file + ": damaged at offset " + std::to_string(scanned.offset) + " after " + count +
              ": " + scanned.fault + "\n");
        return DAMAGED;
    }
    const std::string version = scanned.version.empty()
                                    ? std::string("no version")
                                    : "version \"" + escaped(scanned.version) + "\"";
    write(file + ": whole, " + version + ", " + count + ", " + std::to_string(scanned.bytes) +
          " bytes\n");
    return DONE;
}
