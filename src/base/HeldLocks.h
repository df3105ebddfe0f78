#pragma once

inline namespace korvex {

// What the calling thread holds of the locks that a line of logging takes on its way. Plain values,
// which need no construction and no destruction: they work in signal handlers, exit handlers and
// ending threads.
class HeldLocks {
  public:
    // Stands for one such lock, from before it is waited for until after it is free.
    class One {
      public:
        One() { ++_ones; }
        One(const One&) = delete;
        One& operator=(const One&) = delete;
        ~One() { --_ones; }
    };

    // Whether the thread is inside such a lock. Nothing logs there, so code that finds it so is a
    // signal handler that interrupted logging, and must not wait for what its own thread holds.
    static bool any() { return _ones > 0; }

    // Whether the thread holds all of them, for the length of a fork: it needs to take none then.
    static bool all() { return _all; }
    static void setAll(bool held) { _all = held; }

  private:
    static inline thread_local int _ones = 0;
    static inline thread_local bool _all = false;
};

}  // namespace korvex
