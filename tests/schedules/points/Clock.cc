#include "points/Clock.h"

#include <sys/time.h>
#include <time.h>

#include <cstdarg>
#include <cstdio>
#include <cstring>

#include "points/MutexModel.h"

// The time, the same in every run; the locks that the C library holds while it converts times by
// the time zone, and while it looks up an error's text in the language of the user; and the
// conversions of printf, which read their arguments more than once.

namespace schedules {

namespace {

constexpr long kStart = 1767225600;  // 2026-01-01 00:00:00 UTC

long now = kStart * 1000000;

// glibc's tzset_lock, and those of its message catalogues. A child of a fork has them as they were.
MutexModel zoneLock;
MutexModel catalogueLock;

}  // namespace

void advanceClock(unsigned seconds) {
    now += static_cast<long>(seconds) * 1000000;
}

}  // namespace schedules

using schedules::catalogueLock;
using schedules::now;
using schedules::zoneLock;

SCHEDULES_REAL(struct tm*, localtime_r, (const time_t*, struct tm*));
SCHEDULES_REAL(size_t, strftime, (char*, size_t, const char*, const struct tm*));
SCHEDULES_REAL(int, __xpg_strerror_r, (int, char*, size_t));
SCHEDULES_REAL(int, vsnprintf, (char*, size_t, const char*, va_list));

SCHEDULES_WRAP(int, gettimeofday, (struct timeval * tv, void*)) {
    ++now;
    tv->tv_sec = now / 1000000;
    tv->tv_usec = now % 1000000;
    return 0;
}

SCHEDULES_WRAP(struct tm*, localtime_r, (const time_t* t, struct tm* out)) {
    zoneLock.lock("lock the time zone", SCHEDULES_CALLER);
    struct tm* const result = __real_localtime_r(t, out);
    zoneLock.unlock("unlock the time zone", SCHEDULES_CALLER);
    return result;
}

// Only its %s converts back.
SCHEDULES_WRAP(size_t, strftime, (char* buf, size_t n, const char* fmt, const struct tm* tm)) {
    const bool converts = std::strstr(fmt, "%s") != nullptr;
    if (converts) zoneLock.lock("lock the time zone", SCHEDULES_CALLER);
    const size_t length = __real_strftime(buf, n, fmt, tm);
    if (converts) zoneLock.unlock("unlock the time zone", SCHEDULES_CALLER);
    return length;
}

SCHEDULES_WRAP(int, __xpg_strerror_r, (int number, char* buf, size_t n)) {
    catalogueLock.lock("lock the error texts", SCHEDULES_CALLER);
    const int result = __real___xpg_strerror_r(number, buf, n);
    catalogueLock.unlock("unlock the error texts", SCHEDULES_CALLER);
    return result;
}

SCHEDULES_WRAP(int, vsnprintf, (char* buf, size_t n, const char* fmt, va_list ap)) {
    schedules::announce("vsnprintf", nullptr, SCHEDULES_CALLER);
    return __real_vsnprintf(buf, n, fmt, ap);
}
