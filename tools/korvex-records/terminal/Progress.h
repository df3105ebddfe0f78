#pragma once

#include <cstdint>
#include <memory>

// Shows on standard error, while that is a terminal, what the tool is at and how far it is, from
// the second second of its life on; the line is gone when it ends. There is one at a time.
//
// A thread of its own draws: what reads and saves in the library cannot tell how far it is.
class ProgressDisplay {
  public:
    ProgressDisplay();
    ProgressDisplay(const ProgressDisplay&) = delete;
    ProgressDisplay& operator=(const ProgressDisplay&) = delete;
    ~ProgressDisplay();

  private:
    class Ticker;
    std::unique_ptr<Ticker> _ticker;
};

// These may be called whether or not there is a display.

// Begins a step of so many units; 0 when nobody knows how many. `what` is a literal.
void progressStep(const char* what, std::uint64_t total = 0);
// Of the step's units so many are done.
void progressAt(std::uint64_t done);
// Takes the line away until the next step, because something else goes to the terminal.
void progressAside();
