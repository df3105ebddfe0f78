#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

// Records for a person, in columns below a header: the value's size, the key, and as much of the
// value as fits into so many columns.
class LongList {
  public:
    explicit LongList(std::size_t columns) : _columns(columns) {}

    // So many bytes of a value are enough.
    std::size_t most() const { return _columns + 9; }
    // The key is as it is to be shown; then the value's size, and its beginning.
    void add(std::string key, std::uint64_t size, std::string_view beginning);
    std::string text() const;

  private:
    struct Row {
        std::string key;
        std::size_t keyColumns;
        std::uint64_t size;
        std::string beginning;  // of the value
    };

    const std::size_t _columns;
    std::vector<Row> _rows;
};
