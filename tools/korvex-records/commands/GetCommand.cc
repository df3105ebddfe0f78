#include <unistd.h>

#include <algorithm>

#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "support/TerminalQuery.h"
#include "terminal/HexDump.h"
#include "terminal/Output.h"
#include "terminal/ShownKey.h"
#include "text/Escape.h"

namespace {

void writeHex(std::string_view value) {
    constexpr std::size_t kPiece = 1 << 16;
    for (; !value.empty(); value.remove_prefix(std::min(kPiece, value.size())))
        write(toHex(value.substr(0, kPiece)));
    write("\n");
}

void writeValue(std::string_view value, const Options& options) {
    if (options.hex) {
        writeHex(value);
    } else if (isTerminal(STDOUT_FILENO) && !isText(value)) {
        write(hexDump(value));
    } else {
        write(value);
    }
}

}  // namespace

// The file is read to its end, the other values left out: a fault behind the record, or another one
// with the same key, must not go unsaid.
Status runGet(const Options& options, const std::vector<std::string>& arguments) {
    const std::string key = keyOf(arguments.front(), options);
    const OpenFile file(recordFilePath(options));
    StrictReader reader = file.reader();
    bool found = false;
    while (reader.next()) {
        if (reader.key() != key) continue;
        found = true;
        writeValue(reader.value(), options);
    }
    if (!found) complain(shownKey(key, STDERR_FILENO) + ": no such key");
    return unlessDamaged(reader, found ? DONE : NOT_FOUND);
}
