#include "explorer/Trace.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <map>
#include <sstream>

namespace schedules {

namespace {

// The function and the line of the innermost code at the address.
std::string place(const void* caller) {
    static std::map<const void*, std::string> known;
    if (caller == nullptr) return "";
    const auto found = known.find(caller);
    if (found != known.end()) return found->second;
    std::ostringstream command;
    // The call itself stands before the instruction to which it returns.
    command << "addr2line -Cfs -e /proc/" << getpid() << "/exe "
            << static_cast<const void*>(static_cast<const char*>(caller) - 1) << " 2> /dev/null";
    std::string text;
    if (FILE* const pipe = popen(command.str().c_str(), "r")) {
        char line[300];
        while (fgets(line, sizeof line, pipe) != nullptr) {
            text += line;
            text.back() = ' ';
        }
        pclose(pipe);
    }
    return known[caller] = text;
}

}  // namespace

std::string describe(const Board& board, unsigned most) {
    std::ostringstream out;
    for (unsigned i = board.steps - std::min(board.steps, most); i < board.steps; ++i) {
        const Step& step = board.step[i];
        out << "  " << i << ": thread " << unsigned{step.thread}
            << (step.inChild ? " in the child" : "") << ": " << step.what;
        if (step.object != nullptr) out << ' ' << step.object;
        out << "  " << place(step.caller) << '\n';
    }
    return out.str();
}

}  // namespace schedules
