#pragma once

#include <cstdint>
#include <string>
#include <vector>

// Sizes, in all and by powers of two.
class Histogram {
  public:
    explicit Histogram(std::vector<std::uint64_t> sizes);

    std::uint64_t sum() const;
    // Of no sizes at all: 0. Of an even number the smaller one of the two in the middle.
    std::uint64_t smallest() const;
    std::uint64_t median() const;
    std::uint64_t largest() const;

    // A line for each power of two from the first that occurs to the last, with a bar; the longest
    // has `width` characters.
    std::string bars(std::size_t width) const;

  private:
    std::vector<std::uint64_t> _sorted;
};
