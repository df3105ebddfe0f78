#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "file/FileWindow.h"

// Where the parts of one record lie in a file.
struct RecordFrame {
    std::uint64_t begin = 0;
    std::uint32_t keySize = 0;
    std::uint32_t valueSize = 0;

    std::uint64_t keyAt() const { return begin + 4; }
    std::uint64_t valueAt() const { return keyAt() + keySize + 4; }
    std::uint64_t end() const { return valueAt() + valueSize; }
};

// Reads the lengths of the record that begins at `offset`, which must lie within the file. Lengths
// are believed only as far as the file has bytes. The fault; empty when there is none.
std::string readFrame(FileWindow& file, std::uint64_t offset, RecordFrame& frame);

// Whether a key is taken for the file's version: by its beginning, in any case.
bool looksLikeVersionKey(std::string_view key);

// Whether a key does not survive a save and a load: it looks like the version's key, or holds a
// NUL.
bool isRefusedKey(std::string_view key);

// The version's record, as every file that Korvex writes begins.
inline constexpr std::string_view kVersionKey = "_record-file-version";
inline constexpr std::string_view kVersion = "2.0";
