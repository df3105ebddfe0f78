#include "text/DumpFormat.h"

#include <map>

#include "Check.h"
#include "Input.h"
#include "Lines.h"
#include "Status.h"

namespace {

using Records = std::map<std::string, std::string>;

Records parsed(const std::string& text) {
    Records records;
    parseText(text, [&records](LineInput& in) {
        parseDump(in, [&records](const std::string& key, const std::string& value) {
            check(records.emplace(key, value).second, "a key comes once");
        });
    });
    return records;
}

std::string dump(const Records& records, bool print) {
    std::string text = dumpHeader(print);
    for (const auto& [key, value] : records) {
        appendDumpLine(text, key, print);
        appendDumpLine(text, value, print);
    }
    return text + dumpTrailer();
}

}  // namespace

// What is read as a dump comes back the same from either format.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Records records;
    try {
        records = parsed(Input(data, size).rest());
    } catch (const Failure& failure) {
        checkLineTold(failure, "dump");
        return 0;
    }
    for (const bool print : {false, true})
        check(parsed(dump(records, print)) == records, "a dump read back");
    return 0;
}
