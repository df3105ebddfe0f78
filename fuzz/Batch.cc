#include "text/BatchFormat.h"

#include <string>
#include <vector>

#include "Check.h"
#include "Input.h"
#include "Lines.h"
#include "Status.h"
#include "text/Escape.h"

namespace {

// Each line as it has to be written.
std::string written(const std::string& text) {
    std::string lines;
    parseText(text, [&lines](LineInput& in) {
        parseBatch(in, [&lines](const BatchLine& line) {
            check(line.isPut || line.value.empty(), "only a put has a value");
            lines += line.isPut ? "put\t" : "remove\t";
            lines += escaped(line.key);
            if (line.isPut) lines += "\t" + escaped(line.value);
            lines += "\n";
        });
    });
    return lines;
}

}  // namespace

// What is read as a batch comes back the same; and so does any value that is escaped as it has to
// be.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes = Input(data, size).rest();
    const std::string line = "put\tkey\t" + escaped(bytes) + "\n";
    checkSame(written(line), line, "a value");
    try {
        const std::string lines = written(bytes);
        checkSame(written(lines), lines, "a batch read back");
    } catch (const Failure& failure) {
        checkLineTold(failure, "batch");
    }
    return 0;
}
