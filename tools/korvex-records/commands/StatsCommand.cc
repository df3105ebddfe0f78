#include <cstdio>

#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "terminal/Histogram.h"
#include "terminal/Output.h"
#include "text/Counted.h"

namespace {

constexpr std::size_t kBarWidth = 40;

std::string summary(const char* what, const Histogram& sizes) {
    char line[128];
    const auto number = [](std::uint64_t n) { return static_cast<unsigned long long>(n); };
    std::snprintf(line, sizeof line, "%-6s %15llu %10llu %10llu %10llu\n", what,
                  number(sizes.sum()), number(sizes.smallest()), number(sizes.median()),
                  number(sizes.largest()));
    return line;
}

std::string bars(const char* what, const Histogram& sizes) {
    char header[64];
    std::snprintf(header, sizeof header, "\n%22s %10s\n", what, "records");
    return header + sizes.bars(kBarWidth);
}

}  // namespace

Status runStats(const Options& options, const std::vector<std::string>& arguments) {
    const std::string prefix = prefixOf(arguments, options);
    const OpenFile file(recordFilePath(options));
    StrictReader reader = file.reader();
    std::vector<std::uint64_t> keySizes;
    std::vector<std::uint64_t> valueSizes;
    while (reader.next()) {
        if (!beginsWith(reader.key(), prefix)) continue;
        keySizes.push_back(reader.frame().keySize);
        valueSizes.push_back(reader.frame().valueSize);
    }
    const std::size_t count = keySizes.size();
    write(counted(count, "record") + "\n");
    if (count > 0) {
        const Histogram keys(std::move(keySizes));
        const Histogram values(std::move(valueSizes));
        write("\n                 bytes   smallest     median    largest\n");
        write(summary("keys", keys) + summary("values", values));
        write(bars("bytes of a key", keys) + bars("bytes of a value", values));
    }
    return unlessDamaged(reader, count == 0 ? NOT_FOUND : DONE);
}
