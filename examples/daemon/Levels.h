#pragma once

#include <korvex/util/Pathname.h>

// Levels of logging that an operator changes while the daemon runs: lines "CHANNEL LEVEL" in a
// file, "*" for the root category. A restart forgets them.
class Levels {
  public:
    explicit Levels(const Pathname& file) : _file(file) {}
    // Reads the file and sets the levels; logs each change, and what is refused. The file must
    // belong to the daemon's user, or to root, and nobody else may write to it.
    void apply() const;

  private:
    const Pathname _file;
};
