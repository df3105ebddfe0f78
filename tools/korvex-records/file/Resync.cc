#include "file/Resync.h"

#include <algorithm>
#include <optional>
#include <string>
#include <unordered_set>
#include <vector>

#include "text/Utf8.h"

namespace {

constexpr unsigned kEnough = 3;              // records that follow on each other
constexpr unsigned kFarthest = 1000;         // records that are looked at for a better place
constexpr std::uint32_t kLongKey = 1 << 16;  // bytes; longer keys are not looked for

unsigned differingBytes(std::uint64_t a, std::uint64_t b) {
    unsigned count = 0;
    for (std::uint64_t rest = a ^ b; rest != 0; rest >>= 8)
        count += (rest & 0xFF) != 0 ? 1 : 0;
    return count;
}

bool isOneBit(std::uint64_t bits) {
    return bits != 0 && (bits & (bits - 1)) == 0;
}

using Key = std::optional<std::string>;  // none: any key may come next

class Search {
  public:
    Search(FileWindow& file, std::uint64_t at, const std::deque<RecordFrame>& before)
        : _file(file), _at(at), _before(before) {
        if (!before.empty()) _lastKey = orderOf(before.back());
    }

    Resync run() {
        Resync result;
        result.kept = _before.size();
        result.gone = 1;
        if (const auto end = endOfRefused()) {
            result.next = *end;
            result.isExact = true;
            return result;
        }
        if (findWithin(result)) return result;
        result.next = behind();
        result.isExact = result.next < _file.size() && tracesTo(_at, result.next, _lastKey);
        if (result.isExact || beginsARecord()) return result;
        if (lastMayReach(result.next)) {
            --result.kept;
        } else {
            result.gone = 0;
        }
        return result;
    }

  private:
    std::string keyOf(const RecordFrame& frame) const {
        return std::string(_file.at(frame.keyAt(), frame.keySize));
    }

    // The key that the next one comes behind.
    Key orderOf(const RecordFrame& frame) const {
        Key key = keyOf(frame);
        return isVersion(frame.begin, *key) ? Key() : key;
    }

    static bool isVersion(std::uint64_t begin, const std::string& key) {
        return begin == 0 && key == kVersionKey;
    }

    // The record at `place`, if it is one that may come behind that key.
    bool read(std::uint64_t place, const Key& before, RecordFrame& frame, Key& key) const {
        if (!readFrame(_file, place, frame).empty()) return false;
        key = keyOf(frame);
        return !isRefusedKey(*key) && (!before || *key > *before);
    }

    // Asked for each byte: most places are none by their first length.
    bool mayBegin(std::uint64_t place) const {
        const std::uint64_t left = _file.size() - place;
        return left >= 8 && _file.numberAt(place) <= left - 8;
    }

    // Whether records follow on each other from there: to the end, or `enough` of them, the last
    // one ending beyond the fault. Where what was read before is met, they lead to the fault.
    bool followOn(std::uint64_t place, Key before, unsigned enough) const {
        RecordFrame frame;
        Key key;
        std::vector<std::uint64_t> passed;
        std::unordered_set<std::uint64_t>& dead = enough == kEnough ? _tooFew : _notToEnd;
        for (unsigned count = 0; count < enough || place <= _at; ++count) {
            if (!read(place, before, frame, key) || wasRead(place) || dead.count(place) > 0) {
                dead.insert(passed.begin(), passed.end());
                return false;
            }
            passed.push_back(place);
            before = std::move(key);
            place = frame.end();
            if (place == _file.size()) return true;
        }
        return true;
    }

    bool leadsToEnd(std::uint64_t place, const Key& before) const {
        return followOn(place, before, static_cast<unsigned>(-1));
    }

    // Some of them are enough if a record leaves a trace that begins at `begin`. Should they follow
    // on from the next length as well, so that keys might be values and values keys, its key must
    // be text.
    bool isLikely(std::uint64_t begin, std::uint64_t place, const Key& before) const {
        if (!followOn(place, before, kEnough) || !tracesTo(begin, place, before)) return false;
        const std::uint64_t nextLength = place + 4 + _file.numberAt(place);
        return !followOn(nextLength, before, kEnough) || tracesTo(begin, place, before, true);
    }

    bool wasRead(std::uint64_t place) const {
        const auto starts = [](const RecordFrame& frame, std::uint64_t at) {
            return frame.begin < at;
        };
        const auto found = std::lower_bound(_before.begin(), _before.end(), place, starts);
        return found != _before.end() && found->begin == place;
    }

    // The record at the fault has a key that no record may have, and nothing else is wrong with it.
    // Or a damaged length made that key and leads from it to a value: then records follow on from
    // the next length, too, or do not reach the end.
    std::optional<std::uint64_t> endOfRefused() const {
        RecordFrame frame;
        if (!readFrame(_file, _at, frame).empty()) return std::nullopt;
        const std::uint64_t end = frame.end();
        const bool goesOn = end == _file.size() || leadsToEnd(end, _lastKey) ||
                            (followOn(end, _lastKey, kEnough) &&
                             !followOn(end + 4 + _file.numberAt(end), _lastKey, kEnough));
        return goesOn ? std::optional<std::uint64_t>(end) : std::nullopt;
    }

    // A length that grew: the next record begins within what was read before.
    bool findWithin(Resync& result) const {
        Key formerKey;
        for (std::size_t i = 0; i < _before.size(); ++i) {
            const RecordFrame& frame = _before[i];
            const Key key = orderOf(frame);
            for (std::uint64_t place = frame.begin + 8; place < frame.end(); ++place) {
                if (!mayBegin(place)) continue;
                // The trace comes last, because it costs a look at all that is before the place.
                const bool isBeginning = leadsToEnd(place, formerKey)
                                             ? tracesTo(frame.begin, place, formerKey)
                                             : isLikely(frame.begin, place, formerKey);
                if (!isBeginning) continue;
                result.next = place;
                result.kept = i;
                result.isExact = true;
                return true;
            }
            formerKey = key;
        }
        return false;
    }

    std::uint64_t behind() const {
        for (std::uint64_t place = _at + 1; place < _file.size(); ++place)
            if (mayBegin(place) && leadsToEnd(place, _lastKey)) return better(place);
        for (std::uint64_t place = _at + 8; place < _file.size(); ++place)
            if (mayBegin(place) && isLikely(_at, place, _lastKey)) return place;
        return _file.size();
    }

    // What was found may be a part of the damaged record's value.
    std::uint64_t better(std::uint64_t found) const {
        RecordFrame frame;
        Key key;
        Key before = _lastKey;
        std::uint64_t place = found;
        for (unsigned i = 0; i < kFarthest && place < _file.size(); ++i) {
            if (tracesTo(_at, place, _lastKey)) return place;
            if (!read(place, before, frame, key)) break;
            before = std::move(key);
            place = frame.end();
        }
        return found;
    }

    // Whether a record from `begin` to `end` has one length that is right, so that only the other
    // one is damaged.
    bool tracesTo(std::uint64_t begin, std::uint64_t end, const Key& before,
                  bool textOnly = false) const {
        return end - begin >= 8 && (hasKeyLengthDamaged(begin, end, before, textOnly) ||
                                    hasValueLengthDamaged(begin, end, before, textOnly));
    }

    bool mayCome(std::uint64_t begin, std::uint64_t keySize, const Key& before,
                 bool textOnly) const {
        const std::string key(_file.at(begin + 4, keySize));
        if (isVersion(begin, key)) return true;
        return !isRefusedKey(key) && (!before || key > *before) && (!textOnly || isUtf8(key));
    }

    bool hasKeyLengthDamaged(std::uint64_t begin, std::uint64_t end, const Key& before,
                             bool textOnly) const {
        const std::uint64_t last = std::min(end - 4, begin + kLongKey);
        for (std::uint64_t length = begin + 4; length <= last; ++length) {
            if (_file.numberAt(length) == end - length - 4 &&
                mayCome(begin, length - begin - 4, before, textOnly)) {
                return true;
            }
        }
        return false;
    }

    // One byte of it, since it tells no more than that.
    bool hasValueLengthDamaged(std::uint64_t begin, std::uint64_t end, const Key& before,
                               bool textOnly) const {
        const std::uint32_t keySize = _file.numberAt(begin);
        if (end - begin - 8 < keySize) return false;
        const std::uint64_t size = end - begin - 8 - keySize;
        return differingBytes(_file.numberAt(begin + 4 + keySize), size) <= 1 &&
               mayCome(begin, keySize, before, textOnly);
    }

    // Whether what stands at the fault looks as a record does at its beginning.
    bool beginsARecord() const {
        const std::uint64_t left = _file.size() - _at;
        if (left < 4) {
            const std::string_view high = _file.at(_at + 1, left - 1);
            return high.find_first_not_of('\0') == high.npos;
        }
        const std::uint32_t keySize = _file.numberAt(_at);
        const std::uint64_t there = std::min<std::uint64_t>(keySize, left - 4);
        if (keySize >= kLongKey) return false;
        return there < keySize || mayCome(_at, keySize, _lastKey, false);
    }

    // A length that shrank by the loss of one bit: with it the last record would reach the next.
    bool lastMayReach(std::uint64_t next) const {
        if (_before.empty()) return false;
        const RecordFrame& last = _before.back();
        return isOneBit((next - last.valueAt()) ^ last.valueSize);
    }

    FileWindow& _file;
    const std::uint64_t _at;
    const std::deque<RecordFrame>& _before;
    Key _lastKey;
    // From these places records follow on each other, but not far enough. Without them a file whose
    // values are in order, as its keys are, would be walked through from each of its values.
    mutable std::unordered_set<std::uint64_t> _notToEnd;
    mutable std::unordered_set<std::uint64_t> _tooFew;
};

}  // namespace

Resync resync(FileWindow& file, std::uint64_t at, const std::deque<RecordFrame>& before) {
    return Search(file, at, before).run();
}
