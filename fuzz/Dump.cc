#include "DumpFormat.h"

#include <sstream>

#include "Check.h"
#include "Input.h"
#include "Status.h"

namespace {

std::string dump(const Records& records, bool print) {
    std::string text = dumpHeader(print);
    for (const auto& [key, value] : records)
        text += dumpLine(key, print) + dumpLine(value, print);
    return text + dumpTrailer();
}

}  // namespace

// What is read as a dump comes back the same from either format.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::istringstream in(Input(data, size).rest());
    Records records;
    try {
        records = parseDump(in);
    } catch (const Failure& failure) {
        check(failure.status() == USAGE, "a bad dump is wrong usage");
        check(std::string(failure.what()).compare(0, 11, "dump, line ") == 0, "the line is told");
        return 0;
    }
    for (const bool print : {false, true}) {
        std::istringstream again(dump(records, print));
        check(parseDump(again) == records, "a dump read back");
    }
    return 0;
}
