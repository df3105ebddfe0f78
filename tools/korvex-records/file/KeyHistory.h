#pragma once

#include <cstddef>
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
        std::size_t operator()(std::size_t at) const;
    };
    struct Equal {
        const KeyHistory* owner;
        bool operator()(std::size_t a, std::size_t b) const;
    };

    std::string_view keyAt(std::size_t at) const;
    std::size_t append(std::string_view key);
    void indexAll();

    std::string _bytes;  // each key behind its length
    std::size_t _last = 0;
    bool _ascending = true;
    std::unordered_set<std::size_t, Hash, Equal> _index;  // empty while the keys ascend
};
