#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// Takes a fuzzer's input apart.
class Input {
  public:
    Input(const std::uint8_t* data, std::size_t size)
        : _rest(reinterpret_cast<const char*>(data), size) {}

    // The next n bytes as a number; 0 for those that are missing.
    std::uint64_t number(std::size_t n) {
        std::uint64_t value = 0;
        for (std::size_t i = 0; i < n && i < _rest.size(); ++i)
            value = value << 8U | static_cast<std::uint8_t>(_rest[i]);
        _rest.erase(0, n);
        return value;
    }
    // The same, below the limit.
    std::size_t below(std::size_t limit, std::size_t n) {
        return static_cast<std::size_t>(number(n) % limit);
    }
    // What comes before the next newline, without it.
    std::string line() {
        const std::size_t end = _rest.find('\n');
        const std::string first = _rest.substr(0, end);
        _rest.erase(0, end == _rest.npos ? end : end + 1);
        return first;
    }
    std::string rest() const { return _rest; }

  private:
    std::string _rest;
};

// The text as C sees it: up to its first NUL.
inline std::string upToNul(const std::string& text) {
    return text.c_str();
}
