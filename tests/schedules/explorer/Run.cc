#include "explorer/Run.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "explorer/Heap.h"

extern "C" pid_t __real_fork();
extern "C" pid_t __real_waitpid(pid_t, int*, int);
extern "C" int __real_open(const char*, int, ...);
extern "C" int __real_close(int);
extern "C" int __real_unlink(const char*);

namespace schedules {

namespace {

constexpr unsigned kSecondsOfARun = 20;

void onBadAccess(int signal, siginfo_t* info, void*) {
    const bool freed = Heap::owns(info->si_addr);
    Scheduler::instance().fail("%s at address %p%s", strsignal(signal), info->si_addr,
                               freed ? ", an object that has been freed" : "");
}

void catchBadAccesses() {
    struct sigaction action {};
    action.sa_sigaction = &onBadAccess;
    action.sa_flags = SA_SIGINFO;
    sigaction(SIGSEGV, &action, nullptr);
    sigaction(SIGBUS, &action, nullptr);
}

}  // namespace

// In memory where there is such a place, for there are many small files.
Runner::Runner()
    : _dir((access("/dev/shm", W_OK) == 0 ? "/dev/shm" : "/tmp") +
           std::string("/korvex-schedules-XXXXXX")) {
    void* const memory =
        mmap(nullptr, sizeof(Board), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED || mkdtemp(_dir.data()) == nullptr) {
        std::perror("schedules");
        std::_Exit(2);
    }
    _board = static_cast<Board*>(memory);
    Heap::reserve();
}

Runner::~Runner() {
    clearDirectory();
    rmdir(_dir.c_str());
    munmap(_board, sizeof(Board));
}

void Runner::clearDirectory() const {
    DIR* const dir = opendir(_dir.c_str());
    if (dir == nullptr) return;
    while (const dirent* const entry = readdir(dir)) {
        if (entry->d_name[0] != '.') __real_unlink((_dir + "/" + entry->d_name).c_str());
    }
    closedir(dir);
}

std::string Runner::run(const Scenario& scenario, Strategy& strategy) {
    _board->clear();
    clearDirectory();
    std::fflush(nullptr);
    const pid_t pid = __real_fork();
    if (pid == 0) runChild(scenario, strategy);
    int status = 0;
    if (pid < 0 || __real_waitpid(pid, &status, 0) != pid) return std::strerror(errno);
    return verdict(scenario, status);
}

void Runner::runChild(const Scenario& scenario, Strategy& strategy) {
    alarm(kSecondsOfARun);
    catchBadAccesses();
    const int err = __real_open((_dir + "/stderr").c_str(), O_RDWR | O_CREAT | O_APPEND, 0600);
    if (err < 0 || dup2(err, STDERR_FILENO) < 0 || chdir(_dir.c_str()) != 0) _exit(2);
    __real_close(err);
    Scheduler::instance().begin(*_board, strategy);
    Heap::guard();
    scenario.body();
    _exit(0);
}

std::string Runner::verdict(const Scenario& scenario, int status) const {
    if (_board->failed) return _board->failure;
    Remains remains{WEXITSTATUS(status), _dir, ""};
    remains.err = remains.file("stderr");
    if (WIFSIGNALED(status)) {
        return std::string("ended by a signal: ") + strsignal(WTERMSIG(status)) + "\n" +
               remains.err;
    }
    return scenario.check != nullptr ? scenario.check(remains) : "";
}

}  // namespace schedules
