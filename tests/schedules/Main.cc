#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "explorer/Run.h"
#include "explorer/Scenario.h"
#include "explorer/Trace.h"
#include "strategies/Bounded.h"
#include "strategies/Course.h"
#include "strategies/Priorities.h"

// Explores the orders in which threads can go on. Prints a line a scenario: how many schedules had
// 0, 1, 2 ... preemptions, a "+" where there are more of them, and how many were drawn.

namespace schedules {

namespace {

constexpr const char* kUsage =
    "usage: korvex-schedules [OPTION...] [SCENARIO...]\n"
    "  --list            names the scenarios\n"
    "  --part K/N        every N-th scenario from the K-th on\n"
    "  --bound N         all schedules with at most N preemptions (2)\n"
    "  --limit N         but at most N of each number of preemptions (100000)\n"
    "  --random N        and N by random priorities (1000)\n"
    "  --depth D         with D - 1 changes of them (3)\n"
    "  --seed S          from seed S on (1)\n"
    "  --only-seed S     just that one, and its steps\n"
    "  --replay 'STEP:THREAD ...'  just that schedule, and its steps\n";

struct Options {
    unsigned bound = 2;
    unsigned long limit = 100000;
    unsigned long random = 1000;
    unsigned depth = 3;
    unsigned long seed = 1;
    bool onlySeed = false;
    const char* replay = nullptr;
    unsigned part = 0;  // from 0
    unsigned parts = 1;
    std::vector<std::string> names;
};

class Exploration {
  public:
    Exploration(Runner& runner, const Scenario& scenario, const Options& options)
        : _runner(runner), _scenario(scenario), _options(options) {}

    // Whether all went as it should.
    bool explore();

  private:
    bool exploreBounded();
    bool exploreRandom();
    bool replay(Strategy& strategy);
    bool tellFailure(const std::string& failure, bool mayBeWanted, const std::string& again);
    unsigned usualSteps();

    Runner& _runner;
    const Scenario& _scenario;
    const Options& _options;
    bool _found = false;  // what was wanted
};

bool Exploration::explore() {
    if (_options.replay != nullptr) {
        const Schedule schedule = parse(_options.replay);
        Course course(schedule);
        return replay(course);
    }
    if (_options.onlySeed) {
        Priorities priorities(_options.seed, _options.depth, usualSteps());
        return replay(priorities);
    }
    std::printf("%s:", _scenario.name);
    std::fflush(stdout);
    const bool well = exploreBounded() && exploreRandom();
    if (well && _scenario.wanted != nullptr) {
        std::printf("\n%s: nothing was found, but \"%s\" should have been\n", _scenario.name,
                    _scenario.wanted);
        return false;
    }
    std::printf("\n");
    return well || _found;
}

bool Exploration::exploreBounded() {
    Bounded bounded(_runner, _scenario);
    for (unsigned n = 0; n <= _options.bound; ++n) {
        const Bounded::Result result = bounded.explore(n, _options.limit);
        if (!result.failure.empty()) {
            std::printf(" %u:%lu", n, result.schedules + 1);
            return tellFailure(result.failure, n >= _scenario.wantedFrom,
                               "--replay '" + toText(result.schedule) + "'");
        }
        std::printf(" %u:%lu%s", n, result.schedules, result.complete ? "" : "+");
        std::fflush(stdout);
        if (!result.complete) break;
    }
    return true;
}

// The most that some runs have in which nobody is stopped; the same runs every time, so that a seed
// means the same schedule every time.
unsigned Exploration::usualSteps() {
    unsigned most = 0;
    for (unsigned seed = 1; seed <= 10; ++seed) {
        Priorities undisturbed(seed, 1, 0);
        _runner.run(_scenario, undisturbed);
        most = std::max(most, _runner.board().steps);
    }
    return most;
}

bool Exploration::exploreRandom() {
    if (_options.random == 0) return true;
    const unsigned steps = usualSteps();
    for (unsigned long n = 0; n < _options.random; ++n) {
        Priorities priorities(_options.seed + n, _options.depth, steps);
        const std::string failure = _runner.run(_scenario, priorities);
        if (failure.empty()) continue;
        std::printf(" random:%lu", n + 1);
        return tellFailure(failure, true,
                           "--only-seed " + std::to_string(_options.seed + n) + " --depth " +
                               std::to_string(_options.depth));
    }
    std::printf(" random:%lu", _options.random);
    return true;
}

bool Exploration::tellFailure(const std::string& failure, bool mayBeWanted,
                              const std::string& again) {
    mayBeWanted = mayBeWanted && _scenario.wanted != nullptr;
    if (mayBeWanted && failure.find(_scenario.wanted) != std::string::npos) {
        std::printf(" found, as it should be: %s", failure.c_str());
        _found = true;
        return false;
    }
    std::printf(" FAILED: %s\n%s  again: korvex-schedules %s %s", failure.c_str(),
                describe(_runner.board()).c_str(), again.c_str(), _scenario.name);
    return false;
}

bool Exploration::replay(Strategy& strategy) {
    const std::string failure = _runner.run(_scenario, strategy);
    std::printf("%s%s: %s\n", describe(_runner.board(), kMaxSteps).c_str(), _scenario.name,
                failure.empty() ? "all went well" : failure.c_str());
    return failure.empty();
}

unsigned long number(const char* text) {
    return std::strtoul(text, nullptr, 10);
}

[[noreturn]] void giveUp() {
    std::fputs(kUsage, stderr);
    std::exit(2);
}

[[noreturn]] void list() {
    for (const Scenario& scenario : scenarios())
        std::printf("%s\n", scenario.name);
    std::exit(0);
}

Options read(int argc, char** argv) {
    Options options;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        const auto value = [&] {
            if (++i == argc) giveUp();
            return argv[i];
        };
        if (word == "--bound") {
            options.bound = static_cast<unsigned>(number(value()));
        } else if (word == "--limit") {
            options.limit = number(value());
        } else if (word == "--random") {
            options.random = number(value());
        } else if (word == "--depth") {
            options.depth = static_cast<unsigned>(number(value()));
        } else if (word == "--seed" || word == "--only-seed") {
            options.onlySeed = word == "--only-seed";
            options.seed = number(value());
        } else if (word == "--replay") {
            options.replay = value();
        } else if (word == "--part") {
            if (std::sscanf(value(), "%u/%u", &options.part, &options.parts) != 2) giveUp();
            --options.part;
        } else if (word == "--list") {
            list();
        } else if (word[0] == '-') {
            giveUp();
        } else {
            options.names.push_back(word);
        }
    }
    return options;
}

bool isWanted(const Options& options, const Scenario& scenario) {
    for (const std::string& name : options.names) {
        if (name == scenario.name) return true;
    }
    return options.names.empty();
}

int exploreAll(const Options& options) {
    Runner runner;
    std::sort(scenarios().begin(), scenarios().end(),
              [](const Scenario& a, const Scenario& b) { return std::strcmp(a.name, b.name) < 0; });
    unsigned tried = 0;
    unsigned number = 0;
    bool well = true;
    for (const Scenario& scenario : scenarios()) {
        if (!isWanted(options, scenario) || number++ % options.parts != options.part) continue;
        ++tried;
        well = Exploration(runner, scenario, options).explore() && well;
    }
    if (tried < options.names.size() && options.parts == 1) {
        std::fprintf(stderr, "korvex-schedules: no such scenario\n");
        return 2;
    }
    return well ? 0 : 1;
}

}  // namespace

}  // namespace schedules

int main(int argc, char** argv) {
    return schedules::exploreAll(schedules::read(argc, argv));
}
