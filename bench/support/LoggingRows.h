#pragma once

// The rows of the logging table, over a contestant: a class with
//
//     explicit C(const Setup&);                  // INFO and above; unsupported() where it cannot
//     void info(unsigned n, const char* who);    // "request %u from %s answered"
//     void debug(unsigned n, const char* who);   // the same text, filtered out by the level
//     static void configure(const char* file);   // from a properties file; unsupported() without
//     static void first();                       // the first message after that
//
// Each line is in the kernel when info() returns. Runs in an empty directory of its own.
#include "Measure.h"

#include <thread>

namespace bench {

enum class Layout {
    MESSAGE,  // "%m%n"
    DATED     // "%d{ISO8601} [%t] %-5p %c: %m%n"
};

struct Setup {
    Layout layout = Layout::DATED;
    const char* file = "bench.log";
    unsigned long maxSize = 0;  // bytes; 0: no rotation
    unsigned backups = 0;
};

constexpr const char* kChannel = "bench.channel";
constexpr const char* kWho = "10.0.0.7";

// All threads write to one file: the wall time of a message over all of them, and then the 99th and
// the 99.9th percentile of the single calls, in a run of its own because looking at the clock costs
// too.
template <class C>
void threadsRow(C& contestant, unsigned threads, unsigned n) {
    const auto onAll = [threads](auto work) {
        std::vector<std::thread> running;
        const std::uint64_t begin = now();
        for (unsigned t = 0; t < threads; ++t)
            running.emplace_back(work, t);
        for (std::thread& thread : running)
            thread.join();
        return static_cast<double>(now() - begin);
    };
    const unsigned each = n / threads;
    const double wall = onAll([&](unsigned) {
        for (unsigned i = 0; i < each; ++i)
            contestant.info(i, kWho);
    });
    report("ns", wall / (each * threads));
    std::vector<std::vector<double>> taken(threads, std::vector<double>(each));
    onAll([&](unsigned t) {
        for (double& one : taken[t]) {
            const std::uint64_t begin = now();
            contestant.info(t, kWho);
            one = static_cast<double>(now() - begin);
        }
    });
    for (unsigned t = 1; t < threads; ++t)
        taken[0].insert(taken[0].end(), taken[t].begin(), taken[t].end());
    report("p99", quantile(taken[0], 0.99));
    report("p999", quantile(taken[0], 0.999));
}

template <class C>
void startRow(unsigned n) {
    report("ns", inChildren(n, [] {
               const std::uint64_t begin = now();
               C::configure("start.cfg");
               C::first();
               return static_cast<double>(now() - begin);
           }));
}

template <class C>
int loggingMain(int argc, char** argv) {
    const Row row(argc, argv);
    const unsigned n = row.n;
    if (row.name == "start") {
        startRow<C>(n);
        return 0;
    }
    Setup setup;
    if (row.name == "message") setup.layout = Layout::MESSAGE;
    if (row.name == "null") setup.file = "/dev/null";
    if (row.name == "rotation") {
        setup.maxSize = 1024 * 1024;
        setup.backups = 5;
    }
    static C contestant(setup);  // never destroyed before the threads end
    for (unsigned i = 0; i < 1000; ++i)
        contestant.info(i, kWho);
    if (row.name == "filtered") {
        report("ns", perCall(n, [](unsigned i) { contestant.debug(i, kWho); }));
    } else if (row.name == "threads") {
        threadsRow(contestant, row.number, n);
    } else {
        report("ns", perCall(n, [](unsigned i) { contestant.info(i, kWho); }));
    }
    return 0;
}

}  // namespace bench
