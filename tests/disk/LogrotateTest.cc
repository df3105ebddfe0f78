#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "support/TempDir.h"

namespace {

using testsupport::readFile;
using testsupport::TempDir;
using testsupport::writeFile;

bool haveLogrotate() {
    return std::system("PATH=$PATH:/usr/sbin command -v logrotate > /dev/null") == 0;
}

// A program that logs from three threads. Its messages come at 20 a second by their own stamps,
// however fast they are really written, so that nobody has to wait for the identity check.
class LoggingProgram {
  public:
    explicit LoggingProgram(const std::string& file) {
        _appender.setAttribute("fileName", file.c_str(), Pathname());
        for (int t = 0; t < 3; ++t)
            _threads.emplace_back([this] { logUntilStopped(); });
    }
    LoggingProgram(const LoggingProgram&) = delete;
    LoggingProgram& operator=(const LoggingProgram&) = delete;
    // How many lines it has logged.
    int stop() {
        _stop = true;
        for (std::thread& thread : _threads)
            thread.join();
        _threads.clear();
        return _lines;
    }
    ~LoggingProgram() { stop(); }

  private:
    void logUntilStopped() {
        while (!_stop) {
            const int n = _lines++;
            LogMsgMetadata facts(&_logger, INFO);
            facts.stamp.set(1000000 + n / 20, 0);
            _appender.write(facts, "line " + std::to_string(n) + " end");
        }
    }

    const Logger _logger{"test"};
    LogAppender _appender;
    std::atomic<int> _lines{0};
    std::atomic<bool> _stop{false};
    std::vector<std::thread> _threads;
};

void waitFor(const std::string& file) {
    while (!std::filesystem::exists(file))
        std::this_thread::yield();
}

TEST(LogrotateTest, MovingTheFileAwayLosesAndTearsNoLine) {
    if (!haveLogrotate()) GTEST_SKIP() << "logrotate is not installed";
    const TempDir dir;
    std::string conf = readFile(KORVEX_SOURCE_DIR "/docs/samples/korvex.logrotate");
    const std::string shipped = "/opt/korvex/var/log";
    ASSERT_NE(conf.find(shipped), std::string::npos);
    conf.replace(conf.find(shipped), shipped.size(), dir.path());
    writeFile(dir.file("conf"), conf);
    const std::string log = dir.file("program.log");

    LoggingProgram program(log);
    for (int rotation = 0; rotation < 5; ++rotation) {
        waitFor(log);
        ASSERT_EQ(std::system(("PATH=$PATH:/usr/sbin logrotate -f -s " + dir.file("state") + " " +
                               dir.file("conf"))
                                  .c_str()),
                  0);
    }
    waitFor(log);
    const int logged = program.stop();

    ASSERT_TRUE(std::filesystem::exists(log + ".1"));
    ASSERT_TRUE(std::filesystem::exists(log + ".5.gz"));
    ASSERT_EQ(std::system(("gzip -dc " + log + ".*.gz | cat - " + log + ".1 " + log + " > " +
                           dir.file("all"))
                              .c_str()),
              0);
    std::vector<bool> seen(static_cast<std::size_t>(logged), false);
    std::ifstream all(dir.file("all"));
    int intact = 0;
    for (std::string line; std::getline(all, line);) {
        int n = -1;
        char end = '\0';
        ASSERT_EQ(std::sscanf(line.c_str(), "line %d en%c", &n, &end), 2) << line;
        ASSERT_EQ(end, 'd') << line;
        ASSERT_FALSE(seen.at(static_cast<std::size_t>(n))) << line;
        seen[static_cast<std::size_t>(n)] = true;
        ++intact;
    }
    EXPECT_EQ(intact, logged);
}

}  // namespace
