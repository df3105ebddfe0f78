#pragma once

#include <ctime>

namespace testsupport {

// The library's calls that a test can count or make fail. They reach the hooks through the
// linker's --wrap (WrappedCalls.cmake), so the product code knows nothing of them. Calls made
// inside the C and C++ libraries themselves are not seen, allocations excepted.
enum class Call {
    open,
    read,
    write,
    writev,
    close,
    fstat,
    stat,
    access,
    lseek,
    fcntl,
    fsync,
    rename,
    unlink,
    fopen,
    fread,
    fwrite,
    fclose,
    calloc,
    new_array,   // operator new[]; a failure throws std::bad_alloc
    allocation,  // operator new and new[], those inside the C++ library included
    fgets,
    gettimeofday,
    localtime_r,
    strftime,
    strerror_r,
    setenv,
    pthread_create,
    pthread_attr_init,
    pthread_attr_setstacksize,
    pthread_mutex_init,
    pthread_mutex_lock,
    pthread_mutex_unlock,
    pthread_mutex_trylock,
    pthread_mutex_destroy,
    pthread_join,
    pthread_cond_init,
    pthread_cond_wait,
    pthread_cond_clockwait,
    pthread_key_create,
    pthread_setspecific,
    poptGetContext,
    COUNT
};

// The call's name, for messages.
const char* nameOf(Call call);

// Counts a call for as long as this object lives. One object a call at a time.
class CountCalls {
  public:
    explicit CountCalls(Call call);
    CountCalls(const CountCalls&) = delete;
    CountCalls& operator=(const CountCalls&) = delete;
    virtual ~CountCalls();

    unsigned long count() const;

  protected:
    const Call _call;
};

// Lets the k-th call (from 1) from now on fail with `error`, in any thread: errno for the system
// calls, the returned number for pthread calls and strerror_r. A close or fclose still closes, a
// join still joins.
class FailNth : public CountCalls {
  public:
    enum Persistence { ONCE, FROM_THEN_ON };
    FailNth(Call call, unsigned long k, int error, Persistence persistence = ONCE);

    bool fired() const;
};

// Kills the process by SIGKILL at the k-th call, before it is made.
class KillAtNth : public CountCalls {
  public:
    KillAtNth(Call call, unsigned long k);
};

// Lets the k-th read, write, fread or fwrite move `count` bytes at the most; with 0, the k-th
// pthread_cond_clockwait return at once as if it had been woken.
class ShortNth : public CountCalls {
  public:
    ShortNth(Call call, unsigned long k, unsigned long count);
    // The call after that one fails.
    ShortNth(Call call, unsigned long k, unsigned long count, int errorBehind);

    bool fired() const;
};

// Lets the k-th stat tell of a device whose number is `by` larger, or the k-th gettimeofday of a
// moment that many seconds later.
class ShiftNth : public CountCalls {
  public:
    ShiftNth(Call call, unsigned long k, long long by);

    bool fired() const;
};

// Until when the last two calls of pthread_cond_clockwait were to wait.
extern struct timespec deadlines[2];

// Lets each call take that many microseconds longer, and tells how many threads are in it just now.
class Dwell : public CountCalls {
  public:
    Dwell(Call call, unsigned microseconds);

    int inside() const;
};

}  // namespace testsupport
