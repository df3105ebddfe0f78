#pragma once

#include <korvex/util/Thread.h>

inline namespace korvex {

// Where a new thread waits for go(). It belongs to the Thread object and to the operating-system
// thread together: whichever ends later finds it whole.
class KORVEX_HIDDEN Thread::Gate {
  public:
    // Lets the waiting thread run its main(). A failed assertion when it is open already.
    void open();
    // Sends the waiting thread home: its object is going. Nothing once the gate was opened.
    void abandon();
    // Waits; true when the gate was opened, false when the thread was sent home.
    bool pass();

  private:
    // One lock for all gates: they are used once a thread.
    static Mutex& readyToRunLock();

    bool _ready_to_run KORVEX_GUARDED_BY(readyToRunLock()) = false;
    bool _abandoned KORVEX_GUARDED_BY(readyToRunLock()) = false;
    ConditionWakeAll _ready_to_run_cond;
};

}  // namespace korvex
