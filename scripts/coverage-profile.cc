// Linked into the programs of the coverage build: when a process writes its counters. One that
// aborts does too. One whose other threads still run does not, nor does the child that was forked
// from it: counters that are read in the midst of what they count do not add up, and branches that
// nothing takes would seem to have been taken.
#include <dirent.h>
#include <pthread.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>

extern "C" {
void __llvm_profile_initialize_file();
int __llvm_profile_write_file();
int __llvm_profile_runtime = 0;  // no writing but ours
}

namespace {

bool discarded = false;

bool otherThreadsRun() {
    int entries = 0;  // with the two dots
    DIR* const tasks = opendir("/proc/self/task");
    while (readdir(tasks) != nullptr)
        ++entries;
    closedir(tasks);
    return entries > 3;
}

// Threads that are ending anyway are waited for.
void writeAtExit() {
    for (int i = 0; i < 50 && otherThreadsRun(); ++i)
        usleep(10000);
    if (!discarded && !otherThreadsRun()) __llvm_profile_write_file();
}

void writeAtAbort(int signal) {
    if (!discarded) __llvm_profile_write_file();
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

bool forkedAmongThreads = false;

[[maybe_unused]] const bool begun = [] {
    __llvm_profile_initialize_file();
    std::signal(SIGABRT, writeAtAbort);
    pthread_atfork([] { forkedAmongThreads = otherThreadsRun(); }, nullptr,
                   [] { discarded = discarded || forkedAmongThreads; });
    return std::atexit(writeAtExit) == 0;
}();

}  // namespace
