#pragma once

#include <string>

#include "explorer/Board.h"

namespace schedules {

// The last steps of a run, with their places in the sources where addr2line(1) is there to tell.
std::string describe(const Board& board, unsigned most = 60);

}  // namespace schedules
