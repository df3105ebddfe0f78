#pragma once

#include "framework/service/RecordFileManager/RecordFormat.h"

#include <cstddef>
#include <string_view>

inline namespace korvex {

// A whole record in memory, in the file's own form. Owns nothing.
class RecordView {
  public:
    // A record's first byte.
    explicit RecordView(const char* begin) : _begin(begin) {}

    const char* begin() const { return _begin; }
    std::string_view key() const { return fieldAt(_begin); }
    std::string_view value() const { return fieldAt(_begin + kLengthBytes + key().size()); }
    // Of the whole record, in bytes.
    std::size_t size() const { return 2 * kLengthBytes + key().size() + value().size(); }

  private:
    static std::string_view fieldAt(const char* at) { return {at + kLengthBytes, getLength(at)}; }

    const char* _begin;
};

}  // namespace korvex
