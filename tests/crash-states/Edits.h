#pragma once

#include <algorithm>
#include <stdexcept>
#include <variant>

#include "crash-states/History.h"

// Histories of programs that do it wrong, made from one that does it right.
namespace crashstates {

template <class E>
bool isA(const Event& event) {
    return std::holds_alternative<E>(event);
}

// The first event for which `which` holds, moved right before the first one for which `where` does
// and which must be earlier.
template <class Which, class Where>
History moved(History history, Which which, Where where) {
    auto& events = history.events;
    const auto from = std::find_if(events.begin(), events.end(), which);
    const auto to = std::find_if(events.begin(), events.end(), where);
    if (from == events.end() || to >= from) throw std::logic_error("no such events to move");
    std::rotate(to, from, from + 1);
    return history;
}

inline History without(History history, std::size_t event) {
    history.events.erase(history.events.begin() + static_cast<std::ptrdiff_t>(event));
    return history;
}

}  // namespace crashstates
