#include <korvex/util/LoaderInfo.h>

#include <fcntl.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <exception>

#include "Commands.h"
#include "support/StandardOutput.h"

namespace {

// Were 0 to 2 closed, the record file could be opened there and take what is meant for a stream.
// Reading from 0 and writing to 1 then fail, what goes to 2 vanishes.
void fillStandardDescriptors() {
    for (const int fd : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(fd, F_GETFD) >= 0) continue;
        // The lowest free number is this one.
        static_cast<void>(open("/dev/null", fd == STDOUT_FILENO ? O_RDONLY : O_WRONLY));
    }
}

// What the set-up prints is for people: it goes to standard error, so that standard output holds
// just what was asked for.
void setUp(int argc, char** argv, char** envp) {
    fillStandardDescriptors();
    // A reader that is gone and a file size limit are told by the write that fails.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
    const int out = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    if (out < 0 || dup2(STDERR_FILENO, STDOUT_FILENO) < 0) {
        throw Failure(IO_ERROR, withErrno("cannot turn standard output aside"));
    }
    LoaderInfo::common_main_setup(argc, argv, envp);
    std::fflush(stdout);
    dup2(out, STDOUT_FILENO);
    close(out);
}

Status run(int argc, char** argv) {
    const Options options = parseOptions(argc, argv);
    const Command& command = findCommand(options);
    const Status status = command.run(options, {options.words.begin() + 1, options.words.end()});
    finishOutput();
    return status;
}

}  // namespace

int main(int argc, char** argv, char** envp) {
    try {
        setUp(argc, argv, envp);
        return run(argc, argv);
    } catch (const Failure& failure) {
        complain(failure.what());
        return failure.status();
    } catch (const std::exception& e) {  // the output is lost, for one
        complain(e.what());
        return IO_ERROR;
    }
}
