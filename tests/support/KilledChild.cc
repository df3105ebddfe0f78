#include "support/KilledChild.h"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <optional>

namespace testsupport {

namespace {

constexpr unsigned kHangs = 60;  // seconds

// The child; _exit, because nothing of the test program is to be run down in it.
pid_t start(const std::function<void()>& body) {
    std::fflush(nullptr);
    const pid_t pid = fork();
    if (pid == 0) {
        alarm(kHangs);
        body();
        _exit(0);
    }
    return pid;
}

bool wasKilled(pid_t pid) {
    int status = -1;
    waitpid(pid, &status, 0);
    if (WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL) return true;
    EXPECT_EQ(status, 0);
    return false;
}

}  // namespace

bool killAtCall(Call call, unsigned long k, const std::function<void()>& body) {
    return wasKilled(start([&] {
        const KillAtNth kill(call, k);
        body();
    }));
}

bool killAfter(unsigned microseconds, const std::function<void()>& body) {
    const pid_t pid = start(body);
    usleep(microseconds);
    kill(pid, SIGKILL);
    return wasKilled(pid);
}

}  // namespace testsupport
