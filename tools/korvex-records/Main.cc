#include <korvex/util/LoaderInfo.h>

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <exception>

#include "Commands.h"
#include "Output.h"

namespace {

// A closed standard descriptor would be given to the next file that is opened, and be written to.
// Held open for reading only it makes writing fail instead.
void occupyStandardDescriptors() {
    int fd = 0;
    do {
        fd = open("/dev/null", O_RDONLY);
    } while (fd >= 0 && fd <= STDERR_FILENO);
    if (fd >= 0) close(fd);
}

// What the set-up prints is for people: it goes to standard error, so that standard output holds
// just what was asked for.
void setUp(int argc, char** argv, char** envp) {
    const int out = dup(STDOUT_FILENO);
    dup2(STDERR_FILENO, STDOUT_FILENO);
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
        occupyStandardDescriptors();
        setUp(argc, argv, envp);
        return run(argc, argv);
    } catch (const Failure& failure) {
        complain(failure.what());
        return failure.status();
    } catch (const std::exception& e) {
        complain(e.what());
        return IO_ERROR;
    }
}
