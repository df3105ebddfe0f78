#pragma once

#include <korvex/util/Thread.h>

inline namespace korvex {

// Which workers there are, and which of them the calling thread is.
class ActiveThreads {
  public:
    // Registers the calling thread as `thrptr`, once; it is struck off when it ends.
    static void add(Thread* thrptr);
    // The calling thread's object, or null.
    static Thread* current() { return _current; }
    // The calling thread's object is gone: current() must not give it away any more.
    static void forgetCurrent() { _current = nullptr; }

  private:
    static bool countIn(Thread* thrptr);
    static void setSlot(TSP_Implementor& ptrs, Thread* thrptr);
    static void remove(void* unused);

    // A thread-specific key exists only while there are workers: its clean-up strikes them off and
    // the last one deletes it. So no thread may look itself up by the key without a lock, and this
    // plain pointer beside it answers instead. It needs no destruction, so it is readable in
    // ending threads too.
    static inline thread_local Thread* _current = nullptr;

    // Guards the count, and the key's making and end.
    static Mutex& mutex();

    static TSP_Implementor* _ptrs KORVEX_GUARDED_BY(mutex());
    static int _nthreads KORVEX_GUARDED_BY(mutex());
};

}  // namespace korvex
