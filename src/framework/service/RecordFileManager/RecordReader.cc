#include "framework/service/RecordFileManager/RecordReader.h"

#include "framework/service/RecordFileManager/Pieces.h"
#include "framework/service/RecordFileManager/RecordFormat.h"

#include <algorithm>

inline namespace korvex {

bool RecordReader::next() {
    return !endedInAValue() && readKey() && readValue();
}

// As much as there is of so many bytes.
std::string_view RecordReader::take(std::size_t size) {
    const std::string_view taken(_at, std::min(size, left()));
    _at += taken.size();
    return taken;
}

bool RecordReader::readKey() {
    _record = _at;
    const std::string_view length = take(kLengthBytes);
    if (length.size() < kLengthBytes) {
        // No byte at all: the end of a complete file.
        if (!length.empty() || !_metTheEnd) {
            storeLogger().error("Short read for key length, record file may be corrupt.");
        }
        return false;
    }
    const std::uint32_t size = getLength(length.data());
    _key = take(size);
    reportShortReads(size, _key.size());
    return true;
}

bool RecordReader::readValue() {
    const std::string_view length = take(kLengthBytes);
    if (length.size() < kLengthBytes) {
        storeLogger().error("Short read for value length, record file may be corrupt.");
        return false;
    }
    _valueSize = getLength(length.data());
    _value = take(_valueSize);
    return true;
}

}  // namespace korvex
