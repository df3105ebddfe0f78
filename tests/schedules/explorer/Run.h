#pragma once

#include <string>

#include "explorer/Board.h"
#include "explorer/Scenario.h"
#include "explorer/Scheduler.h"

namespace schedules {

// Runs scenarios, each time in a new process, one of whose threads goes on at a time.
class Runner {
  public:
    // Makes a directory for the runs' files.
    Runner();
    Runner(const Runner&) = delete;
    Runner& operator=(const Runner&) = delete;
    ~Runner();

    // What went wrong; empty: nothing.
    std::string run(const Scenario& scenario, Strategy& strategy);
    // What the last run did, and what all of them have found out.
    Board& board() { return *_board; }
    // Forgets which objects are shared: those of another scenario are others.
    void forgetShared() { _board->sharedObjects = 0; }

  private:
    [[noreturn]] void runChild(const Scenario& scenario, Strategy& strategy);
    std::string verdict(const Scenario& scenario, int status) const;
    void clearDirectory() const;

    std::string _dir;
    Board* _board;
};

}  // namespace schedules
