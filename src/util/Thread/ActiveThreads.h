#pragma once

#include <korvex/util/Thread.h>

#include "util/Thread/Gate.h"

inline namespace korvex {

// Counts the workers, and finds the one of the calling thread.
class ActiveThreads {
  public:
    // Registers the calling thread as that of the gate, once; it is removed when it ends. False if
    // it cannot be counted. In both cases current() returns the gate until forgetCurrent() is
    // called.
    static bool add(Thread::Gate& gate);
    // The calling thread's gate, or null.
    static Thread::Gate* current() { return _current; }
    // The calling thread's gate may go.
    static void forgetCurrent() { _current = nullptr; }

    // Holds this object's lock and that of the gates, during a fork.
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
