#pragma once

#include <pthread.h>
#include <semaphore.h>

#include <cstdarg>
#include <cstddef>
#include <cstdint>

#include "explorer/Board.h"

namespace schedules {

// What a thread is about to do. It can be done as soon as ready(argument) is true.
struct Operation {
    const char* what;
    const void* object;  // null: concerns everybody
    enum Access { READS, CHANGES } access = CHANGES;
    const void* caller = nullptr;
    bool (*ready)(void* argument) = nullptr;  // null: at once
    void* argument = nullptr;
    enum Patience { FOREVER, MAY_TIME_OUT } patience = FOREVER;
    bool mayWake = false;  // without a cause, as waits may
};

// How a thread got its turn.
enum class Turn { READY, TIMED_OUT, WOKEN };

struct ThreadState {
    enum Life { UNUSED, ALIVE, ENDED, GONE };  // gone: left behind by a fork
    Life life = UNUSED;
    unsigned number = 0;
    Operation next{};  // announced, not made yet
    Turn turn = Turn::READY;
    sem_t baton{};
    pthread_t handle{};
    bool joined = false;
    void* (*start)(void*) = nullptr;
    void* argument = nullptr;
    void* result = nullptr;

    // Of its wait on a condition.
    const void* condition = nullptr;
    bool signalled = false;
    unsigned waitsSince = 0;

    // Of its last atomic load: to recognise one that does nothing but look again.
    const void* looksAt = nullptr;
    std::uint64_t sees = 0;
    unsigned seenAtTurn = 0;
    unsigned looks = 0;
};

// Where the threads of a run could go on, for a strategy to say who does.
struct Choice {
    unsigned step;
    unsigned current;
    bool currentCouldGoOn;
    bool matters;  // whether the current thread's operation is one that others may notice
    ThreadMask ready;
    ThreadMask couldTimeOut;
    ThreadMask couldWake;
};

class Strategy {
  public:
    virtual ~Strategy() = default;
    virtual unsigned choose(const Choice& choice) = 0;
};

// Lets one thread of the process run at a time. Each announces what it is about to do, and the
// strategy says whose operation comes next. Does nothing before begin().
class Scheduler {
  public:
    static Scheduler& instance();

    // The calling thread becomes thread 0.
    void begin(Board& board, Strategy& strategy);
    bool running() const { return _board != nullptr; }

    // Returns when it is the calling thread's turn to do so.
    Turn point(const Operation& operation);

    // A new thread, which waits to be chosen; null: there are too many.
    ThreadState* add();
    // On the new thread: waits for its first turn.
    void beginThread(ThreadState& self);
    // On an ending thread: hands the turn on.
    void endThread();
    // In a forked child: nobody else is left.
    void becomeForkedChild();

    // The calling thread frees the memory: the objects there are its business from now on.
    void freed(const void* memory, std::size_t size);

    ThreadState& self();
    ThreadState* find(pthread_t handle);
    ThreadState* begin_threads() { return _threads; }
    ThreadState* end_threads() { return _threads + kMaxThreads; }
    // How often the turn has passed from one thread to another.
    unsigned turns() const { return _turns; }
    unsigned nextWait() { return ++_waits; }
    // Whether no other thread is left.
    bool alone() const;
    bool inForkedChild() const { return _forkedChild; }

    // Ends the run.
    [[noreturn]] void failAt(const void* caller, const void* otherCaller, const char* fmt, ...)
        __attribute__((format(printf, 4, 5)));
    [[noreturn]] void fail(const char* fmt, ...) __attribute__((format(printf, 2, 3)));

    static constexpr int kFailed = 97;  // exit status of a run that failed

  private:
    unsigned choose(ThreadState& self, bool matters);
    void handOver(ThreadState& from, ThreadState& to);
    void note(const ThreadState& self);
    void write(const Step& step);
    void tellShared(const void* object);
    bool isShared(const void* object) const;
    [[noreturn]] void failForDeadlock();
    [[noreturn]] void endFailed(const char* fmt, va_list ap) __attribute__((format(printf, 2, 0)));

    Board* _board = nullptr;
    Strategy* _strategy = nullptr;
    ThreadState _threads[kMaxThreads];
    unsigned _turns = 0;
    unsigned _waits = 0;
    bool _forkedChild = false;
};

}  // namespace schedules
