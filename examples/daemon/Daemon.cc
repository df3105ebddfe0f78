#include "Daemon.h"

#include <fcntl.h>
#include <unistd.h>

#include "Failure.h"

namespace {

pid_t checkedFork() {
    const pid_t pid = fork();
    if (pid < 0) throw systemFailure("cannot fork");
    return pid;
}

void toNull(int fd, int flags) {
    ScopedFileDescriptor null(FileDescriptor(open("/dev/null", flags)));
    if (null.valid()) dup2(null.osdep(), fd);
}

}  // namespace

void Daemon::begin() {
    int ends[2];
    if (pipe(ends) != 0) throw systemFailure("cannot make a pipe");
    ScopedFileDescriptor daemonIs(FileDescriptor{ends[0]});
    _waiting = FileDescriptor(ends[1]);
    if (checkedFork() > 0) {
        _waiting.close();
        char ready;
        _exit(daemonIs.read(&ready, 1) == 1 ? 0 : 1);
    }
    setsid();
    if (checkedFork() > 0) _exit(0);  // the leader of a session could get a terminal again
    if (chdir("/") != 0) throw systemFailure("cannot go to /");
    toNull(STDIN_FILENO, O_RDONLY);
    toNull(STDOUT_FILENO, O_WRONLY);
}

void Daemon::ready() {
    if (!_waiting.valid()) return;
    toNull(STDERR_FILENO, O_WRONLY);
    _waiting.write("", 1);
    _waiting.close();
}
