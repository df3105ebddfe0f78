#include <unistd.h>

#include <algorithm>

#include "commands/Commands.h"
#include "file/OpenFile.h"
#include "file/RecordPath.h"
#include "file/SortedRecords.h"
#include "terminal/Output.h"
#include "terminal/ShownKey.h"

// What would have to be done to the record file to make it FILE: "- KEY" for a record that only the
// record file has, "+ KEY" for one that only FILE has, "~ KEY" for one whose values differ.

namespace {

// One of the two files: where its records are, and the values of those that both have.
class Side {
  public:
    explicit Side(const Pathname& name)
        : _file(name),
          _reader(_file.reader()),
          _sorted(_reader),
          _values(_file.fd(), _file.size(), name),
          _at(_sorted.records().begin()) {}

    bool atEnd() const { return _at == _sorted.records().end(); }
    void advance() { ++_at; }
    std::string_view key() const { return _sorted.keyOf(*_at); }
    std::uint32_t valueSize() const { return _at->valueSize; }
    std::string_view value(std::uint64_t from, std::uint64_t n) {
        return _values.at(_at->valueAt + from, n);
    }
    const StrictReader& reader() const { return _reader; }

  private:
    OpenFile _file;
    StrictReader _reader;
    SortedRecords _sorted;
    FileWindow _values;
    std::vector<SortedRecords::Record>::const_iterator _at;
};

// The number of the first byte that differs; the shorter value's size when there is none.
std::uint64_t firstDifference(Side& a, Side& b) {
    constexpr std::uint64_t kPiece = 1 << 16;
    const std::uint64_t size = std::min(a.valueSize(), b.valueSize());
    for (std::uint64_t from = 0; from < size; from += kPiece) {
        const std::uint64_t n = std::min(kPiece, size - from);
        const std::string_view x = a.value(from, n);
        const std::string_view y = b.value(from, n);
        const auto differs = std::mismatch(x.begin(), x.end(), y.begin());
        if (differs.first != x.end()) {
            return from + static_cast<std::uint64_t>(differs.first - x.begin());
        }
    }
    return size;
}

std::string sizeColumn(const Side* side) {
    const std::string size = side == nullptr ? "-" : std::to_string(side->valueSize());
    return std::string(11 - std::min<std::size_t>(11, size.size()), ' ') + size;
}

class Difference {
  public:
    Difference(const Options& options, Side& own, Side& other)
        : _sizes(options.longList), _own(own), _other(other) {}

    // Whether there was any.
    bool tell() {
        while (!_own.atEnd() || !_other.atEnd()) {
            if (_other.atEnd() || (!_own.atEnd() && _own.key() < _other.key())) {
                line('-', &_own, nullptr, "");
                _own.advance();
            } else if (_own.atEnd() || _other.key() < _own.key()) {
                line('+', nullptr, &_other, "");
                _other.advance();
            } else {
                tellValues();
                _own.advance();
                _other.advance();
            }
        }
        return _found;
    }

  private:
    void tellValues() {
        const bool sameSize = _own.valueSize() == _other.valueSize();
        if (!sameSize && !_sizes) {
            line('~', &_own, &_other, "");
            return;
        }
        const std::uint64_t first = firstDifference(_own, _other);
        if (sameSize && first == _own.valueSize()) return;
        line('~', &_own, &_other, "  from byte " + std::to_string(first));
    }

    void line(char mark, const Side* own, const Side* other, const std::string& behind) {
        _found = true;
        std::string text(1, mark);
        if (_sizes) text += sizeColumn(own) + sizeColumn(other) + " ";
        text += " " + shownKey((own != nullptr ? own : other)->key(), STDOUT_FILENO);
        if (_sizes) text += behind;
        write(text + "\n");
    }

    const bool _sizes;
    Side& _own;
    Side& _other;
    bool _found = false;
};

}  // namespace

Status runDiff(const Options& options, const std::vector<std::string>& arguments) {
    Side other(Pathname(arguments.front()));
    Side own(recordFilePath(options));
    const bool differ = Difference(options, own, other).tell();
    const Status status = unlessDamaged(other.reader(), differ ? NOT_FOUND : DONE);
    return unlessDamaged(own.reader(), status);
}
