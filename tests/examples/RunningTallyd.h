#pragma once

#include <gmock/gmock.h>
#include <sys/types.h>

#include <functional>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"

namespace testsupport {

// The example daemon with the home directory that comes with it, run for real on an address of its
// own.
class TallydTest : public testing::Test {
  protected:
    TallydTest();
    // Kills whatever still runs.
    ~TallydTest() override;
    void SetUp() override;

    // Starts it, with the address and the port; the result is that of the process that was started,
    // which is over when the daemon is ready. `prepare` runs in that process before it becomes the
    // program.
    ChildResult start(
        std::vector<std::string> arguments = {}, const std::function<void()>& prepare = [] {});
    // Starts it with --nodaemon and returns when it has its pid file.
    void startInForeground();
    // The id in the pid file; 0 when there is none.
    pid_t pid() const;
    // Sends the running daemon a signal, and throws when none runs; and waits for its end and
    // returns wait(2)'s status.
    void signal(int number) const;
    int end(int number) const;
    static int endOf(pid_t daemon);  // only waits

    // Sends a datagram; it has arrived at the socket when this returns.
    void send(const std::string& datagram) const;
    // Returns once the condition holds; throws after a while, which ends the test.
    static void eventually(const std::function<bool()>& condition);

    ChildResult records(const std::vector<std::string>& arguments) const;
    // What the record file holds for a name, as korvex-records prints it.
    std::string saved(const std::string& name) const;
    // The lines of a log file without their times; empty when there is no such file. A line without
    // a time is a failure.
    std::vector<std::string> log(const std::string& name) const;

    const TempDir dir;

  private:
    void setEnvironment() const;

    const std::string _host;
    const int _port;
};

}  // namespace testsupport
