#include "file/KeysSoFar.h"

bool KeysSoFar::add(std::string_view key, const std::function<void(const Take&)>& again) {
    if (_history) return _history->add(key);
    if (_count == 0 || key > _last) {
        ++_count;
        _last = key;
        return true;
    }
    _history = std::make_unique<KeyHistory>();
    again([this](std::string_view former) { _history->add(former); });
    return _history->add(key);
}
