#pragma once

#include <korvex/util/Logger.h>

#include <string>
#include <vector>

namespace testsupport {

// A message as the engines shall give it back.
struct Logged {
    LogLevel level;
    std::string channel;
    std::string thread;
    std::string message;
    // What the layout made of the call's instant: its dates, and milliseconds and seconds of
    // uptime.
    std::string time, uptimeMs, uptimeS;
    std::string utc;  // the same instant, as "2007-03-05 14:03:09.007" where TZ is UTC
};

// The i-th message: its text goes through all shapes that make trouble, its level through all nine
// and one that is none, its channel through kChannels.
Logged loggedMessage(unsigned i);

inline const std::vector<std::string> kChannels = {"net", "counters", "a.b", "x-1"};
inline const std::vector<std::string> kThreads = {"Main Thread", "worker-1", "reader 2"};

// Logs `count` messages of all shapes through the appender, and every hundredth besides a message
// of two lines whose second one looks just like a line of the layout: an engine must take that for
// a message of its own. The threads log one after another, waiting `pause` milliseconds after every
// 2000 messages. Returns what was logged, as the engines shall see it. The main thread's object
// must exist.
std::vector<Logged> logAll(LogAppender& appender, unsigned count, unsigned pause = 0);

}  // namespace testsupport
