#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_set>

// Tells a key that came before. While the keys ascend, as they do in all that Korvex writes, that
// costs their bytes only.
class KeyHistory {
  public:
    KeyHistory();
    KeyHistory(const KeyHistory&) = delete;
    KeyHistory& operator=(const KeyHistory&) = delete;

    // Whether the key is new.
    bool add(std::string_view key);

  private:
    struct Hash {
        const KeyHistory* owner;
        std::size_t operator()(std::uint64_t at) const;
    };
    struct Equal {
        const KeyHistory* owner;
        bool operator()(std::uint64_t a, std::uint64_t b) const;
    };

    std::string_view keyAt(std::uint64_t at) const;
    std::uint64_t append(std::string_view key);
    void indexAll();

    std::string _bytes;  // each key behind its length
    std::uint64_t _last = 0;
    bool _ascending = true;
    std::unordered_set<std::uint64_t, Hash, Equal> _index;  // empty while the keys ascend
};
