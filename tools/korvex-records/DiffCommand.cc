#include <algorithm>
#include <cstdio>

#include "Commands.h"
#include "DumpFormat.h"
#include "Escape.h"
#include "Output.h"
#include "Progress.h"
#include "RecordStore.h"

// What would have to be done to the record file to make it FILE: "- KEY" for a record that only the
// record file has, "+ KEY" for one that only FILE has, "~ KEY" for one whose values differ.

namespace {

// One side's value; null where the record is not there.
using Value = const std::string*;

std::size_t firstDifference(const std::string& a, const std::string& b) {
    const auto [at, ignored] = std::mismatch(a.begin(), a.end(), b.begin(), b.end());
    return static_cast<std::size_t>(at - a.begin());
}

std::string sizeColumn(Value value) {
    const std::string size = value == nullptr ? "-" : std::to_string(value->size());
    return std::string(11 - std::min<std::size_t>(11, size.size()), ' ') + size;
}

class Difference {
  public:
    explicit Difference(bool sizes) : _sizes(sizes) {}

    void tell(const std::string& key, Value own, Value other) {
        if (own != nullptr && other != nullptr && *own == *other) return;
        _found = true;
        std::string line(1, own == nullptr ? '+' : other == nullptr ? '-' : '~');
        if (_sizes) line += sizeColumn(own) + sizeColumn(other) + " ";
        line += " " + escaped(key);
        if (_sizes && own != nullptr && other != nullptr) {
            line += "  from byte " + std::to_string(firstDifference(*own, *other));
        }
        write(line + "\n");
    }
    bool found() const { return _found; }

  private:
    const bool _sizes;
    bool _found = false;
};

// Both are in key order.
bool tellDifferences(const std::vector<RecordStore::Record>& own, const Records& others,
                     bool sizes) {
    Difference difference(sizes);
    auto other = others.begin();
    for (const auto& record : own) {
        for (; other != others.end() && other->first < record.key; ++other)
            difference.tell(other->first, nullptr, &other->second);
        const bool inBoth = other != others.end() && other->first == record.key;
        difference.tell(record.key, &record.value, inBoth ? &other->second : nullptr);
        if (inBoth) ++other;
    }
    for (; other != others.end(); ++other)
        difference.tell(other->first, nullptr, &other->second);
    return difference.found();
}

}  // namespace

// FILE is only read: no lock is taken for it and no copy restored. A run of the tool that changes
// it meanwhile puts another file in its place, so one of the two is seen whole.
Status runDiff(const Options& options, const std::vector<std::string>& arguments) {
    const ProgressDisplay display;
    const Pathname file(arguments.front());
    Records others;
    const Scan scanned = scan(
        file, [&](const std::string& key, std::string&& value) { others[key] = std::move(value); });
    if (scanned.missing) throw Failure(IO_ERROR, file + ": no such file");
    const RecordStore store(options);
    const bool differ = tellDifferences(store.enumerate(""), others, options.longList);
    const Status status = unlessDamaged(file, scanned, differ ? NOT_FOUND : DONE);
    return unlessDamaged(store.file(), store.scanned(), status);
}
