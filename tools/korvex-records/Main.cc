#include <korvex/Version.h>
#include <korvex/util/LoaderInfo.h>

#include <fcntl.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <new>

#include "commands/Commands.h"
#include "support/StandardOutput.h"
#include "terminal/Output.h"
#include "terminal/Progress.h"

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

// Where what the set-up prints should go: it is for people. Without a home it is the reason why the
// set-up ends the tool.
int asideOf(const Options& options) {
    const char* const home = std::getenv("KORVEX_HOME");
    const bool isTold = options.verbose || home == nullptr || *home == '\0';
    return isTold ? fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1)
                  : open("/dev/null", O_WRONLY | O_CLOEXEC);
}

// Standard output holds just what was asked for.
void setUp(const Options& options, int argc, char** argv, char** envp) {
    const int out = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    const int aside = asideOf(options);
    if (out < 0 || aside < 0 || dup2(aside, STDOUT_FILENO) < 0) {
        throw Failure(IO_ERROR, withErrno("cannot turn standard output aside"));
    }
    LoaderInfo::common_main_setup(argc, argv, envp);
    std::fflush(stdout);
    dup2(out, STDOUT_FILENO);
    close(out);
    close(aside);
}

// Whether the command line asked for nothing but words about the tool.
bool tellsOfItself(const Options& options) {
    const Command* const command =
        options.words.empty() ? nullptr : commandOf(options.words.front());
    if (options.help && command != nullptr) write(helpText(*command));
    if (options.help && command == nullptr) write(helpText());
    if (!options.help && options.version) write("korvex-records " KORVEX_VERSION_STRING "\n");
    return options.help || options.version;
}

Status run(int argc, char** argv, char** envp) {
    const Options options = parseOptions(argc, argv);
    Status status = DONE;
    if (!tellsOfItself(options)) {
        const Command& command = findCommand(options);
        // A reader that is gone ends what only reads, as it does other tools. It must not end a
        // change in its middle; then the write that fails tells.
        if (command.writes || options.output) std::signal(SIGPIPE, SIG_IGN);
        std::signal(SIGXFSZ, SIG_IGN);
        if (command.run != runHelp) setUp(options, argc, argv, envp);
        const ProgressDisplay display;
        status = command.run(options, {options.words.begin() + 1, options.words.end()});
    }
    finishOutput();
    return status;
}

}  // namespace

int main(int argc, char** argv, char** envp) {
    try {
        fillStandardDescriptors();
        return run(argc, argv, envp);
    } catch (const Failure& failure) {
        complain(failure.what());
        return failure.status();
    } catch (const std::bad_alloc&) {
        complain("out of memory");
        return IO_ERROR;
    } catch (const std::exception& e) {  // the output is lost, for one
        complain(e.what());
        return IO_ERROR;
    }
}
