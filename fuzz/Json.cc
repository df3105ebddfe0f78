#include "text/JsonFormat.h"

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
        parseJson(in, [&records](const std::string& key, const std::string& value) {
            check(records.emplace(key, value).second, "a key comes once");
        });
    });
    return records;
}

void checkBothWays(const Records& records) {
    std::string text;
    for (const auto& [key, value] : records)
        appendJsonLine(text, key, value);
    check(parsed(text) == records, "a dump read back");
}

}  // namespace

// What is read as JSON comes back the same; and so does any value.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes = Input(data, size).rest();
    checkBothWays({{"key", bytes}});
    try {
        checkBothWays(parsed(bytes));
    } catch (const Failure& failure) {
        checkLineTold(failure, "dump");
    }
    return 0;
}
