#pragma once

#include <optional>
#include <string>

#include "findings/Code.h"

// A key that the library refuses, and what it was surely meant to be.
struct MendedKey {
    Code slip;          // the first one
    std::string key;    // without the sign behind it
    std::size_t from;   // where the key stands in the line's content
    std::size_t to;     // and ends
    std::size_t colon;  // the ":" that stands for the "="; npos: there is none
};

// None when the key is right, or when nothing is sure.
std::optional<MendedKey> mendedKey(const std::string& content);
