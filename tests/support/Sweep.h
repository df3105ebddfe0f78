#pragma once

#include <functional>
#include <initializer_list>
#include <optional>
#include <set>
#include <vector>

#include "support/Faults.h"

namespace testsupport {

// One way for a call to fail. Error 0: it moves one byte at most.
struct FaultKind {
    Call call;
    int error;
    FailNth::Persistence persistence;
};

// The ways in which the call can really fail, once and from then on. (pthread_mutex_init with
// default attributes and gettimeofday cannot, so nothing sweeps them.)
std::vector<FaultKind> kindsOf(Call call);

// The fault of one point of a sweep.
class SweptFault {
  public:
    SweptFault(const FaultKind& kind, unsigned long k) : _kind(kind), _k(k) {}

    // The k-th such call fails.
    bool isOf(Call call) const { return _kind.call == call; }
    unsigned long k() const { return _k; }
    bool lasts() const { return _kind.persistence == FailNth::FROM_THEN_ON; }
    int error() const { return _kind.error; }
    // Between the two the k-th call fails.
    void arm();
    void disarm();
    bool fired() const { return _fired; }

  private:
    const FaultKind _kind;
    const unsigned long _k;
    std::optional<FailNth> _failure;
    std::optional<ShortNth> _short;
    bool _fired = false;
};

struct Swept {
    unsigned long points = 0;  // faults that fired
    std::set<Call> fired;      // the calls that were there to fail
};

// Runs the scenario in children, with each way of failing of each call at the first, second,
// third ... such call, until the scenario runs through without a fault. The scenario arms the fault
// around what is under test and expects what must hold afterwards. A child that dies, hangs, leaks
// or fails an expectation is a failure of the test.
Swept sweep(const char* what, std::initializer_list<Call> calls,
            const std::function<void(SweptFault&)>& scenario);

// How much more than usual the sweeps, crash and stress tests are to do: 1, or what
// KORVEX_TEST_SCALE says.
unsigned testScale();

}  // namespace testsupport
