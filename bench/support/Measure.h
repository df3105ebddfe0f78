#pragma once

// What every contestant measures with, so that all are measured alike. A contestant prints its
// figures as "name=value" and the driver, scripts/bench.py, does the rest.
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#define BENCH_TOGGLE_COUNTING CALLGRIND_TOGGLE_COLLECT
#else
#define BENCH_TOGGLE_COUNTING static_cast<void>(0)
#endif

namespace bench {

constexpr int kUnsupported = 3;  // exit status: this contestant cannot do that row

inline std::uint64_t now() {
    timespec t;
    clock_gettime(CLOCK_MONOTONIC, &t);
    return static_cast<std::uint64_t>(t.tv_sec) * 1000000000u +
           static_cast<std::uint64_t>(t.tv_nsec);
}

inline void report(const char* name, double value) {
    std::printf("%s=%.3f\n", name, value);
    std::fflush(stdout);
}

[[noreturn]] inline void unsupported() {
    _exit(kUnsupported);
}

[[noreturn]] inline void giveUp(const char* why) {
    std::fprintf(stderr, "bench: %s\n", why);
    std::exit(1);
}

// Nanoseconds of one of n calls of work(i). Under callgrind only these calls are counted.
template <class Work>
double perCall(unsigned n, Work work) {
    BENCH_TOGGLE_COUNTING;
    const std::uint64_t begin = now();
    for (unsigned i = 0; i < n; ++i)
        work(i);
    const std::uint64_t end = now();
    BENCH_TOGGLE_COUNTING;
    return static_cast<double>(end - begin) / n;
}

inline double quantile(std::vector<double> values, double q) {
    const auto at = static_cast<std::size_t>(q * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(at),
                     values.end());
    return values[at];
}

// What work() returns in a child process of its own: for what a process can do only once.
template <class Work>
double inChild(Work work) {
    int ends[2];
    if (pipe(ends) != 0) giveUp("no pipe");
    const pid_t child = fork();
    if (child == 0) {
        const double value = work();
        _exit(write(ends[1], &value, sizeof value) == sizeof value ? 0 : 1);
    }
    close(ends[1]);
    double value = 0;
    const bool told = read(ends[0], &value, sizeof value) == sizeof value;
    close(ends[0]);
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFEXITED(status) && WEXITSTATUS(status) == kUnsupported) unsupported();
    if (!told) giveUp("a child died");
    return value;
}

// The median of n such children.
template <class Work>
double inChildren(unsigned n, Work work) {
    std::vector<double> values;
    for (unsigned i = 0; i < n; ++i)
        values.push_back(inChild(work));
    return quantile(values, 0.5);
}

// Peak memory of this process image. Not getrusage's: that one remembers what was before exec(2),
// and so never tells less than the driver's interpreter had.
inline double peakMiB() {
    std::FILE* const status = std::fopen("/proc/self/status", "r");
    char line[256];
    long kib = 0;
    while (std::fgets(line, sizeof line, status) != nullptr) {
        if (std::strncmp(line, "VmHWM:", 6) == 0) kib = std::strtol(line + 6, nullptr, 10);
    }
    std::fclose(status);
    return static_cast<double>(kib) / 1024;
}

// What a contestant is called with: a row, "load-1000", which is a name and behind the last '-' a
// number (0 when there is none), and how many calls or child processes to make.
struct Row {
    Row(int argc, char** argv) {
        if (argc != 3) giveUp("usage: contestant ROW N");
        name = argv[1];
        n = static_cast<unsigned>(std::strtoul(argv[2], nullptr, 10));
        const std::string row = name;
        const std::size_t dash = row.rfind('-');
        if (dash == std::string::npos || row.find_first_not_of("0123456789", dash + 1) < row.size())
            return;
        name = row.substr(0, dash);
        number = static_cast<unsigned>(std::strtoul(row.c_str() + dash + 1, nullptr, 10));
    }
    std::string name;
    unsigned number = 0;
    unsigned n = 0;
};

}  // namespace bench
