#include "Compare.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>

#include "Progress.h"
#include "Stream.h"

namespace {

class Comparison {
  public:
    explicit Comparison(std::FILE* file) : _file(file) {}

    bool record(std::string_view key, std::string_view value) { return field(key) && field(value); }
    bool atEnd() { return std::fgetc(_file) == EOF && std::ferror(_file) == 0; }

  private:
    bool field(std::string_view bytes) {
        char length[4];
        for (unsigned i = 0; i < 4; ++i)
            length[i] = static_cast<char>(bytes.size() >> (8 * i));
        return next({length, sizeof length}) && next(bytes);
    }
    bool next(std::string_view expected) {
        char buf[8192];
        while (!expected.empty()) {
            const std::size_t n = std::min(expected.size(), sizeof buf);
            if (std::fread(buf, 1, n, _file) != n) return false;
            if (std::memcmp(buf, expected.data(), n) != 0) return false;
            expected.remove_prefix(n);
        }
        return true;
    }

    std::FILE* const _file;
};

}  // namespace

bool fileHolds(const Pathname& file, const std::vector<RecordStore::Record>& records) {
    const Stream stream(file.fopen("rb"));
    if (!stream) return false;
    Comparison comparison(stream.get());
    if (!comparison.record("_record-file-version", "2.0")) return false;
    progressStep("comparing", records.size());
    std::uint64_t compared = 0;
    for (const RecordStore::Record& r : records) {
        if (!comparison.record(r.key, r.value)) return false;
        progressAt(++compared);
    }
    return comparison.atEnd();
}
