#include "file/Salvage.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <map>

#include "Check.h"
#include "Input.h"
#include "reference/RecordFile.h"

namespace {

using Records = std::map<std::string, std::string>;

// Text, so that no bytes of it pass for a length: a record within a value could be told from none.
std::string text(Input& input, std::size_t most) {
    std::string field(input.below(most, 1), 'a');
    for (char& c : field)
        c = static_cast<char>(' ' + input.number(1) % 95);
    return field;
}

Records recordsOf(Input& input) {
    Records records;
    for (std::uint64_t count = input.number(1) % 12; count > 0; --count) {
        const std::string key = text(input, 6);
        records[key] = text(input, 12);
    }
    return records;
}

// What was done to a file: the bytes from `begin` to `end` are not those that were written, and
// where they meet, something was left out.
struct Damage {
    std::string bytes;
    std::size_t begin = 0;
    std::size_t end = 0;

    bool touches(const RecordFrame& frame) const {
        return frame.begin < std::max(end, begin + 1) && frame.end() > begin;
    }
};

Damage damaged(std::string bytes, Input& input) {
    Damage damage;
    const std::uint64_t how = input.number(1) % 4;
    damage.begin = input.below(bytes.size() + 1, 2);
    const std::size_t length = std::min(input.below(256, 1), bytes.size() - damage.begin);
    damage.end = damage.begin + length;
    if (how == 0) {  // cut
        bytes.resize(damage.begin);
        damage.end = damage.begin;
    } else if (how == 1 && damage.begin < bytes.size()) {  // one byte
        bytes[damage.begin] = static_cast<char>(input.number(1));
        damage.end = damage.begin + 1;
    } else if (how == 2) {  // as a part of a disk that cannot be read
        bytes.replace(damage.begin, length, length, '\xff');
    } else {
        bytes.insert(damage.begin, length, '\xff');
    }
    damage.bytes = std::move(bytes);
    return damage;
}

class MemoryFile {
  public:
    explicit MemoryFile(const std::string& bytes) : _fd(memfd_create("records", 0)) {
        check(pwrite(_fd, bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size()),
              "pwrite");
    }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;
    ~MemoryFile() { close(_fd); }

    int fd() const { return _fd; }

  private:
    const int _fd;
};

// Each byte belongs to one record or gap at most; and of bytes that were not touched no record
// comes that was not written.
void checkSalvaged(const Damage& damage, const Records& written) {
    const MemoryFile file(damage.bytes);
    std::uint64_t at = 0;
    Salvaging to;
    to.take = [&](const RecordFrame& frame, const std::string& key, std::string_view value) {
        check(frame.begin >= at, "the file's order");
        at = frame.end();
        if (damage.touches(frame)) return;
        const auto found = written.find(key);
        check(found != written.end() && found->second == value, "a record that was not written");
    };
    to.tell = [&](const Gap& gap) {
        check(gap.offset >= at && gap.bytes > 0, "a gap in its place");
        at = gap.offset + gap.bytes;
        check(at <= damage.bytes.size(), "the end of a gap");
    };
    salvage(file.fd(), damage.bytes.size(), "records", to);
}

}  // namespace

// Records are written, the file is damaged, and salvaged. Of a whole one all comes back; and any
// bytes at all do no harm.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Input input(data, size);
    const Records records = recordsOf(input);
    const std::string whole = reference::saveRecords(records);
    std::size_t count = 0;
    Salvaging to;
    to.take = [&](const RecordFrame&, const std::string& key, std::string_view value) {
        check(records.at(key) == value, "a record of a whole file");
        ++count;
    };
    to.tell = [](const Gap&) { check(false, "a gap in a whole file"); };
    const MemoryFile file(whole);
    salvage(file.fd(), whole.size(), "records", to);
    check(count == records.size(), "all records of a whole file");
    checkSalvaged(damaged(whole, input), records);

    const std::string bytes = Input(data, size).rest();
    Damage any;
    any.bytes = bytes;
    any.end = bytes.size();
    checkSalvaged(any, {});
    return 0;
}
