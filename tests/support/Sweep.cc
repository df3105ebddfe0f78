#include "support/Sweep.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "support/Child.h"

namespace testsupport {

namespace {

// What a child says of its point.
enum Verdict { THROUGH = 0, BROKEN = 1, FIRED = 10 };

std::vector<int> errorsOf(Call call) {
    switch (call) {
        case Call::open:
        case Call::fopen:
            return {EIO, ENOSPC, EINTR, EMFILE};
        case Call::read:
            return {EIO, EINTR, 0};
        case Call::write:
            return {EIO, ENOSPC, EINTR, 0};
        case Call::fread:
            return {EIO, 0};
        case Call::fwrite:
            return {EIO, ENOSPC, 0};
        case Call::close:
        case Call::fclose:
            return {EIO, ENOSPC, EINTR};
        case Call::rename:
        case Call::unlink:
            return {EIO, ENOSPC};
        case Call::calloc:
        case Call::allocation:
            return {ENOMEM};
        case Call::pthread_create:
            return {EAGAIN, EPERM};
        case Call::pthread_key_create:
        case Call::pthread_mutex_init:
        case Call::pthread_cond_init:
            return {EAGAIN, ENOMEM};
        case Call::pthread_attr_init:
        case Call::pthread_setspecific:
            return {ENOMEM};
        case Call::pthread_attr_setstacksize:
        case Call::pthread_mutex_lock:
            return {EINVAL};
        default:
            return {EIO};
    }
}

Verdict runPoint(SweptFault& fault, const std::function<void(SweptFault&)>& scenario) {
    scenario(fault);
    if (testing::Test::HasFailure()) return BROKEN;
    return fault.fired() ? FIRED : THROUGH;
}

}  // namespace

std::vector<FaultKind> kindsOf(Call call) {
    std::vector<FaultKind> kinds;
    for (const int error : errorsOf(call)) {
        kinds.push_back({call, error, FailNth::ONCE});
        // Signals without end would stop anyone's work, and so mean nothing.
        if (error != EINTR && error != 0) kinds.push_back({call, error, FailNth::FROM_THEN_ON});
    }
    return kinds;
}

void SweptFault::arm() {
    if (_kind.error != 0) {
        _failure.emplace(_kind.call, _k, _kind.error, _kind.persistence);
    } else {
        _short.emplace(_kind.call, _k, 1);
    }
}

void SweptFault::disarm() {
    _fired = _failure ? _failure->fired() : _short->fired();
    _failure.reset();
    _short.reset();
}

Swept sweep(const char* what, std::initializer_list<Call> calls,
            const std::function<void(SweptFault&)>& scenario) {
    Swept swept;
    for (const Call call : calls) {
        for (const FaultKind& kind : kindsOf(call)) {
            for (unsigned long k = 1;; ++k) {
                const ChildResult child = runInChild([&] {
                    SweptFault fault(kind, k);
                    return runPoint(fault, scenario);
                });
                if (child.status == THROUGH) break;
                if (child.status != FIRED) {
                    ADD_FAILURE() << what << ": " << nameOf(call) << " number " << k
                                  << (kind.persistence == FailNth::ONCE ? ", once, " : ", and on, ")
                                  << (kind.error != 0 ? std::strerror(kind.error) : "short")
                                  << ": status " << child.status << ", signal " << child.signal
                                  << '\n'
                                  << child.out << child.err;
                    return swept;
                }
                ++swept.points;
                swept.fired.insert(call);
            }
        }
    }
    std::printf("[   swept  ] %s: %lu points\n", what, swept.points);
    return swept;
}

unsigned testScale() {
    const char* const scale = std::getenv("KORVEX_TEST_SCALE");
    return scale != nullptr ? static_cast<unsigned>(std::strtoul(scale, nullptr, 10)) : 1;
}

}  // namespace testsupport
