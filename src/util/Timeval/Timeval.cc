#include <korvex/util/Timeval.h>

#include "base/Assert.h"
#include "platform/LibcLock.h"

#include <algorithm>
#include <cstdlib>
#include <limits>

inline namespace korvex {

namespace {

constexpr long long kMaxSec = std::numeric_limits<int>::max();
constexpr long long kMinSec = std::numeric_limits<int>::min();
constexpr int kMaxUsec = 999999;

// The distance with its microseconds brought into 0 to 999999.
struct Distance {
    long long sec;
    long long usec;
};

Distance distance(const struct timeval& later, const struct timeval& earlier) {
    Distance d{static_cast<long long>(later.tv_sec) - earlier.tv_sec,
               static_cast<long long>(later.tv_usec) - earlier.tv_usec};
    if (d.usec < 0) {
        d.sec -= 1;
        d.usec += 1000000;
    }
    return d;
}

}  // namespace

void Timeval::setToNow() {
    if (gettimeofday(&_tv, nullptr) != 0) std::abort();
    if (_tv.tv_sec > kMaxSec) setToMax();
    _tv.tv_sec = std::max<time_t>(_tv.tv_sec, kMinSec);
}

Timeval Timeval::now() {
    return CurrentTimeval();
}

void Timeval::setToMax() {
    set(static_cast<int>(kMaxSec), kMaxUsec);
}

void Timeval::set(int sec, int usec) {
    _tv.tv_sec = sec;
    _tv.tv_usec = usec;
}

void Timeval::setSaturated(long long sec) {
    if (sec > kMaxSec) {
        setToMax();
    } else {
        _tv.tv_sec = static_cast<time_t>(sec);
    }
}

void Timeval::addSec(unsigned int secs) {
    setSaturated(static_cast<long long>(_tv.tv_sec) + secs);
}

void Timeval::addMsec(unsigned long long msecs) {
    if (msecs >= static_cast<unsigned long long>(kMaxSec) * 1000) {
        setToMax();
        return;
    }
    long long sec = static_cast<long long>(_tv.tv_sec) + static_cast<long long>(msecs / 1000);
    _tv.tv_usec += static_cast<suseconds_t>(msecs % 1000) * 1000;
    if (_tv.tv_usec > kMaxUsec) {
        KORVEX_ASSERT(_tv.tv_usec < 2000000);
        sec += 1;
        _tv.tv_usec -= 1000000;
    }
    setSaturated(sec);
}

void Timeval::localtime(struct tm& out) const {
    const LibcLock lock;
    if (localtime_r(&_tv.tv_sec, &out) != &out) std::abort();
}

bool Timeval::operator<(const Timeval& other) const {
    if (_tv.tv_sec != other._tv.tv_sec) return _tv.tv_sec < other._tv.tv_sec;
    return _tv.tv_usec < other._tv.tv_usec;
}

bool Timeval::operator<=(const Timeval& other) const {
    if (_tv.tv_sec != other._tv.tv_sec) return _tv.tv_sec < other._tv.tv_sec;
    return _tv.tv_usec <= other._tv.tv_usec;
}

long long Timeval::msecDifference(const Timeval& later, const Timeval& earlier) {
    const Distance d = distance(later._tv, earlier._tv);
    return d.sec * 1000 + (d.usec + 999) / 1000;
}

long long Timeval::usecDifference(const Timeval& later, const Timeval& earlier) {
    const Distance d = distance(later._tv, earlier._tv);
    return d.sec * 1000000 + d.usec / 1000;
}

}  // namespace korvex
