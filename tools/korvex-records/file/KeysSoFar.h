#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "file/KeyHistory.h"

// Tells a key that came before in what is read. While the keys ascend, as they do in all that
// Korvex writes, the last one is enough; when they do not, those so far are read again.
class KeysSoFar {
  public:
    using Take = std::function<void(std::string_view key)>;

    // Whether the key is new. `again(take)` hands on the keys before it once more.
    bool add(std::string_view key, const std::function<void(const Take&)>& again);
    // How many keys were new while they ascended.
    std::uint64_t count() const { return _count; }

  private:
    std::uint64_t _count = 0;
    std::string _last;
    std::unique_ptr<KeyHistory> _history;  // of keys that do not ascend
};
