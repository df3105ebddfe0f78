#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <cstdio>
#include <cstdlib>

#include "engines/Shapes.h"

// Logs COUNT messages of all shapes through the appender "LOG" of the configuration, and prints
// what an engine shall find: a line for each message, of level, channel, thread, dates, uptime, the
// instant in UTC and the message's bytes in hexadecimal.
// Usage: engine-writer CONFIGURATION COUNT [PAUSE]
int main(int argc, char** argv) {
    if (argc != 3 && argc != 4) return 2;
    const Thread mainThread;
    if (!Logger::initialize(Pathname(argv[1]), Pathname())) return 1;
    LogAppender& appender = *LogAppender::find("LOG", false);
    const auto count = static_cast<unsigned>(std::strtoul(argv[2], nullptr, 10));
    const auto pause = argc == 4 ? static_cast<unsigned>(std::strtoul(argv[3], nullptr, 10)) : 0;
    for (const testsupport::Logged& one : testsupport::logAll(appender, count, pause)) {
        unsigned long length = 0;
        std::printf("%s\t%s\t%s\t%s\t%s\t%s\t%s\t", loglevel2str(&length, one.level),
                    one.channel.c_str(), one.thread.c_str(), one.time.c_str(), one.uptimeMs.c_str(),
                    one.uptimeS.c_str(), one.utc.c_str());
        for (const char c : one.message)
            std::printf("%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
        std::putchar('\n');
    }
    return std::fflush(stdout) == 0 ? 0 : 1;
}
