// Linked into the programs of the coverage build: a process that aborts writes its counters too.
#include <csignal>

extern "C" int __llvm_profile_write_file();

namespace {

void writeAndDie(int signal) {
    __llvm_profile_write_file();
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

[[maybe_unused]] const auto previous = std::signal(SIGABRT, writeAndDie);

}  // namespace
