#pragma once

#include "framework/service/RecordFileManager/StoreLogger.h"

#include <algorithm>
#include <cstddef>

inline namespace korvex {

// Calls read(at, wanted) for the pieces of a field, one after the other; it returns how many bytes
// came. A piece that came short is not completed: the next one goes to its own place.
template <class Read>
void readPieces(std::size_t length, Read read) {
    constexpr std::size_t kPiece = 1000;  // bytes
    for (std::size_t at = 0; at < length; at += kPiece) {
        const std::size_t wanted = std::min(length - at, kPiece);
        const std::size_t got = read(at, wanted);
        if (got != wanted) storeLogger().error("Short read, record file may be corrupt.");
        if (got == 0) return;
    }
}

// Reports a field of which only the first bytes are there, as reading its pieces would.
inline void reportShortReads(std::size_t length, std::size_t there) {
    if (there >= length) return;
    readPieces(length, [there](std::size_t at, std::size_t wanted) {
        return at < there ? std::min(wanted, there - at) : 0;
    });
}

}  // namespace korvex
