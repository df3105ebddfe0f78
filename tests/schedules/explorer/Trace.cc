#include "explorer/Trace.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <map>
#include <sstream>

namespace schedules {

namespace {

// The function and the line of the innermost code at each step's call. (All by one command, which
// has much to read.)
std::map<const void*, std::string> placesOf(const Board& board, unsigned from) {
    std::map<const void*, std::string> places;
    for (unsigned i = from; i < board.steps; ++i) {
        if (board.step[i].caller != nullptr) places[board.step[i].caller];
    }
    std::ostringstream command;
    command << "addr2line -Cfs -e /proc/" << getpid() << "/exe";
    // A call stands before the instruction to which it returns.
    for (const auto& [caller, place] : places)
        command << ' ' << static_cast<const void*>(static_cast<const char*>(caller) - 1);
    command << " 2> /dev/null";
    FILE* const pipe = popen(command.str().c_str(), "r");
    if (pipe == nullptr) return places;
    char function[500];
    char line[500];
    for (auto& [caller, place] : places) {
        if (fgets(function, sizeof function, pipe) == nullptr) break;
        if (fgets(line, sizeof line, pipe) == nullptr) break;
        function[std::strcspn(function, "\n")] = line[std::strcspn(line, "\n")] = '\0';
        place = std::string(function) + " " + line;
    }
    pclose(pipe);
    return places;
}

}  // namespace

std::string describe(const Board& board, unsigned most) {
    const unsigned from = board.steps - std::min(board.steps, most);
    const auto places = placesOf(board, from);
    std::ostringstream out;
    for (unsigned i = from; i < board.steps; ++i) {
        const Step& step = board.step[i];
        out << "  " << i << ": thread " << unsigned{step.thread}
            << (step.inChild ? " in the child" : "") << ": " << step.what;
        if (step.object != nullptr) out << ' ' << step.object;
        if (step.caller != nullptr) out << "  " << places.at(step.caller);
        out << '\n';
    }
    return out.str();
}

}  // namespace schedules
