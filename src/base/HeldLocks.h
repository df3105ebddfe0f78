#pragma once

inline namespace korvex {

// Which of the locks that logging takes are held by the calling thread. Plain values, which need no
// construction and no destruction, so they work in signal handlers, exit handlers and ending
// threads.
class HeldLocks {
  public:
    // Marks one such lock as held: from before the thread waits for it until after it is free.
    class One {
      public:
        One() { ++_ones; }
        One(const One&) = delete;
        One& operator=(const One&) = delete;
        ~One() { --_ones; }
    };

    // Whether the thread holds such a lock. Code under the locks does not log. So if this is true
    // where a message is logged, a signal handler interrupted logging; it must not wait for its own
    // thread.
    static bool any() { return _ones > 0; }

    // Whether the thread holds all of them, during a fork. Then it needs to take none.
    static bool all() { return _all; }
    static void setAll(bool held) { _all = held; }

  private:
    static inline thread_local int _ones = 0;
    static inline thread_local bool _all = false;
};

}  // namespace korvex
