#include "support/Faults.h"

#include <fcntl.h>
#include <popt.h>
#include <pthread.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <sys/uio.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdarg>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <new>

#include "support/LinkNames.h"

namespace testsupport {

namespace {

constexpr unsigned long kNever = 0;
constexpr int kKill = -1;  // no errno
constexpr unsigned long kUnlimited = static_cast<unsigned long>(-1);

struct Plan {
    std::atomic<bool> active{false};
    std::atomic<unsigned long> calls{0};
    std::atomic<unsigned long> failAt{kNever};
    std::atomic<bool> persistent{false};
    std::atomic<int> error{0};  // 0 with failAt set: a short count instead of a failure
    std::atomic<unsigned long> limit{kUnlimited};
    std::atomic<int> errorBehind{0};  // of the call after a short one
    std::atomic<long long> shift{0};
    std::atomic<unsigned> dwell{0};  // microseconds that each call takes longer
    std::atomic<int> inside{0};      // threads in the call just now
};

Plan plans[static_cast<std::size_t>(Call::COUNT)];

Plan& planOf(Call call) {
    return plans[static_cast<std::size_t>(call)];
}

struct Verdict {
    int error = 0;
    unsigned long limit = kUnlimited;
    long long shift = 0;
};

Verdict judge(Call call) {
    Plan& plan = planOf(call);
    if (!plan.active) return {};
    const unsigned long nth = ++plan.calls;
    const unsigned long at = plan.failAt;
    if (at != kNever && nth == at + 1 && plan.errorBehind != 0) return {plan.errorBehind};
    if (at == kNever || nth < at || (nth > at && !plan.persistent)) return {};
    if (plan.error == kKill) kill(getpid(), SIGKILL);
    return {plan.error, plan.limit, plan.shift};
}

// Stands in a hook for as long as the call lasts. Looks at nothing that would order threads unless
// somebody asked for it: the thread sanitizer must see them as they are.
class Inside {
  public:
    explicit Inside(Call call) : _plan(planOf(call)), _counted(_plan.dwell != 0) {
        if (!_counted) return;
        ++_plan.inside;
        usleep(_plan.dwell);
    }
    Inside(const Inside&) = delete;
    Inside& operator=(const Inside&) = delete;
    ~Inside() {
        if (_counted) --_plan.inside;
    }

  private:
    Plan& _plan;
    const bool _counted;
};

bool fails(Call call) {
    const Verdict verdict = judge(call);
    if (verdict.error != 0) errno = verdict.error;
    return verdict.error != 0;
}

}  // namespace

const char* nameOf(Call call) {
    static constexpr const char* names[] = {
        "open",
        "read",
        "write",
        "writev",
        "close",
        "fstat",
        "stat",
        "access",
        "lseek",
        "fcntl",
        "fsync",
        "rename",
        "unlink",
        "fopen",
        "fread",
        "fwrite",
        "fclose",
        "calloc",
        "new_array",
        "allocation",
        "fgets",
        "gettimeofday",
        "localtime_r",
        "strftime",
        "strerror_r",
        "setenv",
        "pthread_create",
        "pthread_attr_init",
        "pthread_attr_setstacksize",
        "pthread_mutex_init",
        "pthread_mutex_lock",
        "pthread_mutex_unlock",
        "pthread_mutex_trylock",
        "pthread_mutex_destroy",
        "pthread_join",
        "pthread_cond_init",
        "pthread_cond_wait",
        "pthread_cond_clockwait",
        "pthread_key_create",
        "pthread_setspecific",
        "poptGetContext",
    };
    static_assert(std::size(names) == static_cast<std::size_t>(Call::COUNT));
    return names[static_cast<std::size_t>(call)];
}

CountCalls::CountCalls(Call call) : _call(call) {
    Plan& plan = planOf(call);
    plan.calls = 0;
    plan.failAt = kNever;
    plan.shift = 0;
    plan.errorBehind = 0;
    plan.dwell = 0;
    plan.active = true;
}

CountCalls::~CountCalls() {
    planOf(_call).active = false;
    planOf(_call).dwell = 0;
}

unsigned long CountCalls::count() const {
    return planOf(_call).calls;
}

FailNth::FailNth(Call call, unsigned long k, int error, Persistence persistence)
    : CountCalls(call) {
    Plan& plan = planOf(call);
    plan.error = error;
    plan.limit = kUnlimited;
    plan.persistent = persistence == FROM_THEN_ON;
    plan.failAt = k;
}

bool FailNth::fired() const {
    return count() >= planOf(_call).failAt;
}

KillAtNth::KillAtNth(Call call, unsigned long k) : CountCalls(call) {
    Plan& plan = planOf(call);
    plan.error = kKill;
    plan.persistent = false;
    plan.failAt = k;
}

ShortNth::ShortNth(Call call, unsigned long k, unsigned long count) : CountCalls(call) {
    Plan& plan = planOf(call);
    plan.error = 0;
    plan.limit = count;
    plan.persistent = false;
    plan.failAt = k;
}

ShortNth::ShortNth(Call call, unsigned long k, unsigned long count, int errorBehind)
    : ShortNth(call, k, count) {
    planOf(call).errorBehind = errorBehind;
}

bool ShortNth::fired() const {
    return count() >= planOf(_call).failAt;
}

ShiftNth::ShiftNth(Call call, unsigned long k, long long by) : CountCalls(call) {
    Plan& plan = planOf(call);
    plan.error = 0;
    plan.limit = kUnlimited;
    plan.shift = by;
    plan.persistent = false;
    plan.failAt = k;
}

bool ShiftNth::fired() const {
    return count() >= planOf(_call).failAt;
}

struct timespec deadlines[2] = {};

Dwell::Dwell(Call call, unsigned microseconds) : CountCalls(call) {
    planOf(call).dwell = microseconds;
}

int Dwell::inside() const {
    return planOf(_call).inside;
}

}  // namespace testsupport

using testsupport::Call;
using testsupport::fails;
using testsupport::Inside;
using testsupport::judge;

// Gives a hook the name under which the linker looks for it.
#define REAL(name) __asm__("__real_" LINK_NAME_##name)
#define WRAP(name) __asm__("__wrap_" LINK_NAME_##name)

// One hook a call. FORWARD covers those that only fail or go through.
#define FORWARD(failure, result, name, parameters, arguments) \
    result __real_##name parameters;                          \
    result __wrap_##name parameters {                         \
        const Inside inside(Call::name);                      \
        if (fails(Call::name)) return failure;                \
        return __real_##name arguments;                       \
    }

// The same for those that the linker may know by another name.
#define FORWARD_RENAMED(failure, result, name, parameters, arguments) \
    result __real_##name parameters REAL(name);                       \
    result __wrap_##name parameters WRAP(name);                       \
    result __wrap_##name parameters {                                 \
        const Inside inside(Call::name);                              \
        if (fails(Call::name)) return failure;                        \
        return __real_##name arguments;                               \
    }

// The same for calls that return their error number.
#define FORWARD_NUMBER(call, name, parameters, arguments)      \
    int __real_##name parameters;                              \
    int __wrap_##name parameters {                             \
        const Inside inside(call);                             \
        if (const int error = judge(call).error) return error; \
        return __real_##name arguments;                        \
    }

extern "C" {

int __real_open(const char* path, int flags, mode_t mode) REAL(open);
int __wrap_open(const char* path, int flags, ...) WRAP(open);
int __wrap_open(const char* path, int flags, ...) {
    va_list ap;
    va_start(ap, flags);
    const mode_t mode = (flags & O_CREAT) != 0 ? va_arg(ap, mode_t) : 0;
    va_end(ap);
    return fails(Call::open) ? -1 : __real_open(path, flags, mode);
}

int __real_fcntl(int fd, int command, long argument) REAL(fcntl);
int __wrap_fcntl(int fd, int command, ...) WRAP(fcntl);
int __wrap_fcntl(int fd, int command, ...) {
    va_list ap;
    va_start(ap, command);
    const long argument = va_arg(ap, long);
    va_end(ap);
    return fails(Call::fcntl) ? -1 : __real_fcntl(fd, command, argument);
}

ssize_t __real_read(int fd, void* p, size_t n);
ssize_t __wrap_read(int fd, void* p, size_t n) {
    const auto verdict = judge(Call::read);
    if (verdict.error != 0) {
        errno = verdict.error;
        return -1;
    }
    return __real_read(fd, p, std::min<size_t>(n, verdict.limit));
}

ssize_t __real_write(int fd, const void* p, size_t n);
ssize_t __wrap_write(int fd, const void* p, size_t n) {
    const auto verdict = judge(Call::write);
    if (verdict.error != 0) {
        errno = verdict.error;
        return -1;
    }
    return __real_write(fd, p, std::min<size_t>(n, verdict.limit));
}

size_t __real_fread(void* p, size_t size, size_t n, FILE* file);
size_t __wrap_fread(void* p, size_t size, size_t n, FILE* file) {
    const auto verdict = judge(Call::fread);
    if (verdict.error != 0) {
        errno = verdict.error;
        return 0;
    }
    return __real_fread(p, size, std::min<size_t>(n, verdict.limit), file);
}

size_t __real_fwrite(const void* p, size_t size, size_t n, FILE* file);
size_t __wrap_fwrite(const void* p, size_t size, size_t n, FILE* file) {
    const auto verdict = judge(Call::fwrite);
    if (verdict.error != 0) {
        errno = verdict.error;
        return 0;
    }
    return __real_fwrite(p, size, std::min<size_t>(n, verdict.limit), file);
}

char* __real_fgets(char* p, int n, FILE* file);
char* __wrap_fgets(char* p, int n, FILE* file) {
    return fails(Call::fgets) ? nullptr : __real_fgets(p, n, file);
}

int __real_close(int fd);
int __wrap_close(int fd) {
    const int error = judge(Call::close).error;
    const int result = __real_close(fd);
    if (error == 0) return result;
    errno = error;
    return -1;
}

int __real_fclose(FILE* file);
int __wrap_fclose(FILE* file) {
    const int error = judge(Call::fclose).error;
    const int result = __real_fclose(file);
    if (error == 0) return result;
    errno = error;
    return EOF;
}

int __real_pthread_join(pthread_t thread, void** result);
int __wrap_pthread_join(pthread_t thread, void** result) {
    const int error = judge(Call::pthread_join).error;
    const int joined = __real_pthread_join(thread, result);
    return error != 0 ? error : joined;
}

int __real_stat(const char* path, struct stat* st) REAL(stat);
int __wrap_stat(const char* path, struct stat* st) WRAP(stat);
int __wrap_stat(const char* path, struct stat* st) {
    const auto verdict = judge(Call::stat);
    if (verdict.error != 0) {
        errno = verdict.error;
        return -1;
    }
    const int result = __real_stat(path, st);
    st->st_dev += static_cast<dev_t>(verdict.shift);
    return result;
}

int __real_gettimeofday(struct timeval* tv, void* zone) REAL(gettimeofday);
int __wrap_gettimeofday(struct timeval* tv, void* zone) WRAP(gettimeofday);
int __wrap_gettimeofday(struct timeval* tv, void* zone) {
    const auto verdict = judge(Call::gettimeofday);
    if (verdict.error != 0) {
        errno = verdict.error;
        return -1;
    }
    const int result = __real_gettimeofday(tv, zone);
    tv->tv_sec += static_cast<time_t>(verdict.shift);
    return result;
}

FORWARD(-1, ssize_t, writev, (int fd, const struct iovec* vec, int n), (fd, vec, n))
FORWARD_RENAMED(-1, int, fstat, (int fd, struct stat* st), (fd, st))
FORWARD(-1, int, access, (const char* path, int mode), (path, mode))
FORWARD_RENAMED(-1, off_t, lseek, (int fd, off_t off, int whence), (fd, off, whence))
FORWARD(-1, int, fsync, (int fd), (fd))
FORWARD(-1, int, rename, (const char* from, const char* to), (from, to))
FORWARD(-1, int, unlink, (const char* path), (path))
FORWARD_RENAMED(nullptr, FILE*, fopen, (const char* path, const char* mode), (path, mode))
FORWARD(nullptr, void*, calloc, (size_t n, size_t size), (n, size))
FORWARD_RENAMED(nullptr, struct tm*, localtime_r, (const time_t* t, struct tm* out), (t, out))
FORWARD(0, size_t, strftime, (char* buf, size_t n, const char* fmt, const struct tm* tm),
        (buf, n, fmt, tm))
FORWARD(-1, int, setenv, (const char* name, const char* value, int overwrite),
        (name, value, overwrite))
FORWARD_NUMBER(Call::strerror_r, __xpg_strerror_r, (int number, char* buf, size_t n),
               (number, buf, n))
FORWARD_NUMBER(Call::pthread_create, pthread_create,
               (pthread_t * thread, const pthread_attr_t* attr, void* (*start)(void*), void* arg),
               (thread, attr, start, arg))
FORWARD_NUMBER(Call::pthread_attr_init, pthread_attr_init, (pthread_attr_t * attr), (attr))
FORWARD_NUMBER(Call::pthread_attr_setstacksize, pthread_attr_setstacksize,
               (pthread_attr_t * attr, size_t size), (attr, size))
FORWARD_NUMBER(Call::pthread_mutex_init, pthread_mutex_init,
               (pthread_mutex_t * mutex, const pthread_mutexattr_t* attr), (mutex, attr))
FORWARD_NUMBER(Call::pthread_mutex_lock, pthread_mutex_lock, (pthread_mutex_t * mutex), (mutex))
FORWARD_NUMBER(Call::pthread_mutex_unlock, pthread_mutex_unlock, (pthread_mutex_t * mutex), (mutex))
FORWARD_NUMBER(Call::pthread_mutex_trylock, pthread_mutex_trylock, (pthread_mutex_t * mutex),
               (mutex))
FORWARD_NUMBER(Call::pthread_mutex_destroy, pthread_mutex_destroy, (pthread_mutex_t * mutex),
               (mutex))
FORWARD_NUMBER(Call::pthread_cond_init, pthread_cond_init,
               (pthread_cond_t * cond, const pthread_condattr_t* attr), (cond, attr))
FORWARD_NUMBER(Call::pthread_cond_wait, pthread_cond_wait,
               (pthread_cond_t * cond, pthread_mutex_t* mutex), (cond, mutex))
int __real_pthread_cond_clockwait(pthread_cond_t* cond, pthread_mutex_t* mutex, clockid_t clock,
                                  const struct timespec* until) REAL(pthread_cond_clockwait);
int __wrap_pthread_cond_clockwait(pthread_cond_t* cond, pthread_mutex_t* mutex, clockid_t clock,
                                  const struct timespec* until) WRAP(pthread_cond_clockwait);
int __wrap_pthread_cond_clockwait(pthread_cond_t* cond, pthread_mutex_t* mutex, clockid_t clock,
                                  const struct timespec* until) {
    const auto verdict = judge(Call::pthread_cond_clockwait);
    testsupport::deadlines[0] = testsupport::deadlines[1];
    testsupport::deadlines[1] = *until;
    if (verdict.error != 0) return verdict.error;
    if (verdict.limit == 0) return 0;  // woken without cause
    return __real_pthread_cond_clockwait(cond, mutex, clock, until);
}
FORWARD_NUMBER(Call::pthread_key_create, pthread_key_create,
               (pthread_key_t * key, void (*cleanup)(void*)), (key, cleanup))
FORWARD_NUMBER(Call::pthread_setspecific, pthread_setspecific,
               (pthread_key_t key, const void* value), (key, value))
FORWARD(nullptr, poptContext, poptGetContext,
        (const char* name, int argc, const char** argv, const struct poptOption* options,
         unsigned int flags),
        (name, argc, argv, options, flags))

}  // extern "C"

// Replaced for the whole program, so that allocations made inside the C++ library count too.
void* operator new(std::size_t n) {
    if (fails(Call::allocation)) throw std::bad_alloc();
    if (void* const p = std::malloc(std::max<std::size_t>(n, 1))) return p;
    throw std::bad_alloc();
}
void* operator new[](std::size_t n) {
    if (fails(Call::new_array)) throw std::bad_alloc();
    return operator new(n);
}
void* operator new(std::size_t n, const std::nothrow_t&) noexcept {
    return fails(Call::allocation) ? nullptr : std::malloc(std::max<std::size_t>(n, 1));
}
void* operator new[](std::size_t n, const std::nothrow_t& nothrow) noexcept {
    return fails(Call::new_array) ? nullptr : operator new(n, nothrow);
}
void operator delete(void* p) noexcept {
    std::free(p);
}
void operator delete(void* p, const std::nothrow_t&) noexcept {
    std::free(p);
}
void operator delete[](void* p) noexcept {
    std::free(p);
}
void operator delete[](void* p, const std::nothrow_t&) noexcept {
    std::free(p);
}
void operator delete(void* p, std::size_t) noexcept {
    std::free(p);
}
void operator delete[](void* p, std::size_t) noexcept {
    std::free(p);
}
