#include "support/Child.h"

#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <iostream>

namespace testsupport {

namespace {

// An unnamed file takes the output: unlike a pipe it cannot fill up and block the child.
class Capture {
  public:
    explicit Capture(int fd) : _fd(fd), _file(std::tmpfile()) {}
    Capture(const Capture&) = delete;
    Capture& operator=(const Capture&) = delete;
    ~Capture() { std::fclose(_file); }

    void redirect() const { dup2(fileno(_file), _fd); }
    std::string text() const {
        std::string all;
        char buf[4096];
        std::rewind(_file);
        for (std::size_t n; (n = std::fread(buf, 1, sizeof buf, _file)) > 0;)
            all.append(buf, n);
        return all;
    }

  private:
    const int _fd;
    std::FILE* const _file;
};

[[noreturn]] void childMain(const std::function<int()>& body, unsigned seconds) {
    alarm(seconds);
    int result = 99;
    try {
        result = body();
    } catch (const std::exception& e) {
        std::cerr << "escaped from the child's body: " << e.what() << '\n';
    }
    std::exit(result);
}

// An emulator of a foreign machine adds a line of its own when its program is killed by a signal.
void dropEmulatorsLine(ChildResult& result) {
    if (result.signal == 0 || std::getenv("KORVEX_EMULATOR") == nullptr) return;
    const std::size_t at = result.err.rfind("qemu: uncaught target signal ");
    if (at != std::string::npos) result.err.erase(at);
}

}  // namespace

ChildResult runInChild(const std::function<int()>& body, unsigned seconds) {
    std::fflush(nullptr);
    const Capture out(STDOUT_FILENO);
    const Capture err(STDERR_FILENO);
    const pid_t pid = fork();
    if (pid == 0) {
        out.redirect();
        err.redirect();
        childMain(body, seconds);
    }
    ChildResult result;
    int status = 0;
    if (pid < 0 || waitpid(pid, &status, 0) != pid) return result;
    if (WIFEXITED(status)) result.status = WEXITSTATUS(status);
    if (WIFSIGNALED(status)) result.signal = WTERMSIG(status);
    result.out = out.text();
    result.err = err.text();
    dropEmulatorsLine(result);
    return result;
}

void endForkedChild(int status) {
    syscall(SYS_exit_group, status);
    std::abort();
}

std::string ownStderr() {
    std::string all;
    char buf[4096];
    for (ssize_t n;
         (n = pread(STDERR_FILENO, buf, sizeof buf, static_cast<off_t>(all.size()))) > 0;)
        all.append(buf, static_cast<std::size_t>(n));
    return all;
}

}  // namespace testsupport
