#include "crash-states/TracedChild.h"

#include <sys/ptrace.h>
#include <sys/uio.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <stdexcept>

namespace crashstates {

namespace {

constexpr unsigned kHangs = 60;  // seconds

[[noreturn]] void childMain(const std::function<int()>& body) {
    alarm(kHangs);
    // The leak checker needs ptrace for itself; _exit, because nothing of the test program is to
    // be run down here.
    setenv("LSAN_OPTIONS", "detect_leaks=0", 1);
    ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
    raise(SIGSTOP);
    _exit(body());
}

// The child and all its threads, stopped at the beginning and at the end of each call.
class Tracer {
  public:
    Tracer(pid_t child, const std::function<void(const SystemCall&)>& seen)
        : _child(child), _seen(seen) {}

    int run() {
        int status = waitFor(_child);
        if (!WIFSTOPPED(status)) fail("does not start");
        if (ptrace(PTRACE_SETOPTIONS, _child, nullptr,
                   PTRACE_O_TRACESYSGOOD | PTRACE_O_TRACECLONE | PTRACE_O_TRACEFORK |
                       PTRACE_O_TRACEVFORK | PTRACE_O_TRACEEXEC | PTRACE_O_EXITKILL) != 0) {
            fail("cannot be traced");
        }
        goOn(_child, 0);
        for (;;) {
            const pid_t who = waitpid(-1, &status, __WALL);
            if (who < 0) fail("is lost");
            if (WIFSTOPPED(status)) {
                goOn(who, stopped(who, status));
            } else if (who == _child) {
                if (!WIFEXITED(status)) fail("is killed");
                return WEXITSTATUS(status);
            }
        }
    }

  private:
    [[noreturn]] void fail(const char* what) const {
        kill(_child, SIGKILL);
        throw std::runtime_error(std::string("the traced child ") + what);
    }
    int waitFor(pid_t pid) const {
        int status = 0;
        if (waitpid(pid, &status, 0) != pid) fail("is lost");
        return status;
    }
    static void goOn(pid_t who, int signal) {
        ptrace(PTRACE_SYSCALL, who, nullptr, static_cast<long>(signal));
    }
    // The signal to go on with.
    int stopped(pid_t who, int status) {
        const int signal = WSTOPSIG(status);
        if (signal == (SIGTRAP | 0x80)) {
            atCall(who);
            return 0;
        }
        const bool isNewThread = signal == SIGSTOP;
        const bool isEvent = status >> 16 != 0;
        return isNewThread || isEvent ? 0 : signal;
    }
    void atCall(pid_t who) {
        struct __ptrace_syscall_info info {};
        if (ptrace(PTRACE_GET_SYSCALL_INFO, who, sizeof info, &info) <= 0) {
            fail("cannot be looked at");
        }
        if (info.op == PTRACE_SYSCALL_INFO_ENTRY) {
            SystemCall& call = _underWay[who];
            call.process = who;
            call.number = static_cast<long>(info.entry.nr);
            std::copy(info.entry.args, info.entry.args + 6, call.arguments);
        } else if (info.op == PTRACE_SYSCALL_INFO_EXIT && _underWay.count(who) > 0) {
            SystemCall call = _underWay[who];
            _underWay.erase(who);
            call.result = info.exit.rval;
            if (!info.exit.is_error) _seen(call);
        }
    }

    const pid_t _child;
    const std::function<void(const SystemCall&)>& _seen;
    std::map<pid_t, SystemCall> _underWay;
};

}  // namespace

std::string SystemCall::textArgument(unsigned i) const {
    // Piece by piece, as memory may end at any page.
    constexpr std::size_t kPiece = 256;
    std::string text;
    for (std::uintptr_t at = arguments[i];;) {
        char piece[kPiece];
        const std::size_t size = kPiece - at % kPiece;
        iovec here{piece, size};
        iovec there{reinterpret_cast<void*>(at), size};
        if (process_vm_readv(process, &here, 1, &there, 1, 0) != static_cast<ssize_t>(size)) {
            throw std::runtime_error("the traced child's memory cannot be read");
        }
        const std::size_t length = strnlen(piece, size);
        text.append(piece, length);
        if (length < size) return text;
        at += size;
    }
}

int traceCalls(const std::function<int()>& body,
               const std::function<void(const SystemCall&)>& seen) {
    std::fflush(nullptr);
    const pid_t child = fork();
    if (child < 0) throw std::runtime_error("fork failed");
    if (child == 0) childMain(body);
    return Tracer(child, seen).run();
}

}  // namespace crashstates
