#pragma once

#include <korvex/util/Thread.h>

#include "util/Thread/Gate.h"

inline namespace korvex {

// Which workers there are, and which of them the calling thread is.
class ActiveThreads {
  public:
    // Registers the calling thread as the one of that gate, once; it is struck off when it ends.
    // False when it cannot be counted. It is then known as that one until forgetCurrent().
    static bool add(Thread::Gate& gate);
    // The calling thread's gate, or null.
    static Thread::Gate* current() { return _current; }
    // The calling thread's gate may go.
    static void forgetCurrent() { _current = nullptr; }

    // For the length of a fork: this one's lock and the gates'.
    static void takeLocks();
    static void freeLocks();

  private:
    static bool countIn(Thread::Gate& gate);
    static void setSlot(TSP_Implementor& ptrs, Thread::Gate& gate);
    static void remove(void* slot);

    // A thread-specific key exists only while there are workers: its clean-up strikes them off and
    // the last one deletes it. So no thread may look itself up by the key without a lock, and this
    // plain pointer beside it answers instead. It needs no destruction, so it is readable in
    // ending threads too.
    static inline thread_local Thread::Gate* _current = nullptr;

    // Guards the count, and the key's making and end.
    static Mutex& mutex();

    static TSP_Implementor* _ptrs KORVEX_GUARDED_BY(mutex());
    static int _nthreads KORVEX_GUARDED_BY(mutex());
};

}  // namespace korvex
