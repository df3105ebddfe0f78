#pragma once

#include "framework/service/RecordFileManager/FileBytes.h"

#include <cstdint>
#include <string_view>

inline namespace korvex {

// Iterates over the records of a file in memory. A length is trusted only as far as the file has
// bytes. Missing bytes are reported, except those of a value: its user reports them.
class RecordReader {
  public:
    explicit RecordReader(const FileBytes& bytes)
        : _at(bytes.begin()), _end(bytes.end()), _metTheEnd(bytes.metTheEnd) {}

    // The next record; false at the end of the file or of what can be read of it.
    bool next();

    const char* record() const { return _record; }
    std::string_view key() const { return _key; }
    std::string_view value() const { return _value; }
    // As the file says. There may be less of it.
    std::uint32_t valueSize() const { return _valueSize; }
    bool valueIsCut() const { return _value.size() < _valueSize; }
    // Whether the file ended within the value of the last record.
    bool endedInAValue() const { return valueIsCut() && _metTheEnd; }

  private:
    std::size_t left() const { return static_cast<std::size_t>(_end - _at); }
    std::string_view take(std::size_t size);
    bool readKey();
    bool readValue();

    const char* _at;
    const char* const _end;
    const bool _metTheEnd;

    const char* _record = nullptr;
    std::string_view _key;
    std::string_view _value;
    std::uint32_t _valueSize = 0;
};

}  // namespace korvex
