#pragma once

#include <korvex/util/Pathname.h>

#include <cstdint>
#include <string>
#include <string_view>

// The records in memory, which are those of RecordFileManager. There is one at a time.
class RecordMemory {
  public:
    struct Counts {
        std::uint64_t added = 0;
        std::uint64_t changed = 0;
        std::uint64_t removed = 0;
    };

    // Begins without records.
    RecordMemory();
    RecordMemory(const RecordMemory&) = delete;
    RecordMemory& operator=(const RecordMemory&) = delete;

    // Loads a file of so many records. Whoever calls looks whether they all came.
    void load(const Pathname& file, std::uint64_t count);

    // False when the key is absent.
    bool get(const std::string& key, std::string& value) const;
    bool has(const std::string& key) const;
    // Whether the key has just this value.
    bool holds(const std::string& key, std::string_view value) const;

    // Throws Failure USAGE for what would not come back.
    void put(const std::string& key, std::string_view value);
    // False when the key is absent.
    bool remove(const std::string& key);
    // Of put() and remove().
    const Counts& counts() const { return _counts; }
    bool isChanged() const;
    // How many records there are, if each load brought what it should.
    std::uint64_t size() const { return _size; }

    // Writes the file. What went wrong shows in what it holds then; what errno was is returned.
    int save(const Pathname& file) const;

  private:
    std::uint64_t _size = 0;
    Counts _counts;
};
