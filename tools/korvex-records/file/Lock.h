#pragma once

#include <chrono>
#include <optional>

#include "file/OpenFile.h"

// How long a run waits for others: --wait, or for ever.
class Patience {
  public:
    explicit Patience(std::optional<unsigned> seconds);

    bool hasEnd() const { return _seconds.has_value(); }
    bool isOver() const;
    unsigned seconds() const { return *_seconds; }

  private:
    std::optional<unsigned> _seconds;
    std::chrono::steady_clock::time_point _end;
};

// Waits until no other run changes the file, and keeps others from it as long as it is open. False
// when its name has come to mean another file, or none. Throws Failure IO_ERROR, also when the
// patience is over.
bool lock(OpenFile& file, const Patience& patience);
