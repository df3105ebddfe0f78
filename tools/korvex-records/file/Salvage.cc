#include "file/Salvage.h"

#include <deque>
#include <memory>

#include "file/FileWindow.h"
#include "file/KeyHistory.h"
#include "file/RecordFrame.h"
#include "file/Resync.h"
#include "terminal/Progress.h"
#include "text/Escape.h"

namespace {

constexpr std::size_t kProbe = 1 << 16;

class Salvager {
  public:
    Salvager(int fd, std::uint64_t size, const std::string& name, const Salvaging& to)
        : _to(to), _file(fd, size, name), _probe(fd, size, name, kProbe, kProbe / 2) {}

    void run() {
        while (_at < _file.size()) {
            const std::string fault = readRecord();
            if (!fault.empty()) passGap(fault);
            progressAt(_at);
        }
        _keys.reset();  // before whoever takes the records needs memory for them
        handOn(_read.size());
    }

  private:
    std::string readRecord() {
        RecordFrame frame;
        std::string fault = readFrame(_file, _at, frame);
        if (!fault.empty()) return fault;
        const std::string key(_file.at(frame.keyAt(), frame.keySize));
        if (looksLikeVersionKey(key) && !isVersion(frame, key)) {
            return "key \"" + escaped(key) + "\" is taken for the version";
        }
        if (key.find('\0') != key.npos) return "key \"" + escaped(key) + "\" holds a NUL";
        if (!_keys->add(key)) return "key \"" + escaped(key) + "\" stands twice";
        _read.push_back(frame);
        _at = frame.end();
        return "";
    }

    static bool isVersion(const RecordFrame& frame, const std::string& key) {
        return frame.begin == 0 && key == kVersionKey;
    }

    void handOn(std::size_t count) {
        for (; count > 0; --count) {
            const RecordFrame frame = _read.front();
            _read.pop_front();
            const std::string key(_file.at(frame.keyAt(), frame.keySize));
            if (isVersion(frame, key)) continue;
            _to.take(frame, key, _file.at(frame.valueAt(), frame.valueSize));
        }
        _read.clear();
    }

    void passGap(const std::string& reason) {
        Gap gap;
        gap.reason = reason;
        gap.offset = _at;
        const Resync found = resync(_probe, _at, _read);
        if (found.kept < _read.size()) {
            gap.offset = _read[found.kept].begin;
            gap.reason += " at offset " + std::to_string(_at) + ", by a length before it";
        }
        gap.bytes = found.next - gap.offset;
        gap.gone = found.gone;
        gap.isExact = found.isExact;
        handOn(found.kept);
        _to.tell(gap);
        _at = found.next;
    }

    const Salvaging& _to;
    FileWindow _file;
    FileWindow _probe;
    std::uint64_t _at = 0;
    std::unique_ptr<KeyHistory> _keys = std::make_unique<KeyHistory>();
    // Since the last gap. They are handed on behind the next one only, because that may make them
    // doubtful.
    std::deque<RecordFrame> _read;
};

}  // namespace

void salvage(int fd, std::uint64_t size, const std::string& name, const Salvaging& to) {
    progressStep("salvaging", size);
    Salvager(fd, size, name, to).run();
}
