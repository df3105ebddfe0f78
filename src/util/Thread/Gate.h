#pragma once

#include <korvex/util/Thread.h>

#include <atomic>
#include <memory>

inline namespace korvex {

// What a Thread object and its operating-system thread share: whichever ends later finds it whole.
// The thread learns from it alone what it is called and whether its object is still there, and
// waits in it for go().
class KORVEX_HIDDEN Thread::Gate : public std::enable_shared_from_this<Thread::Gate> {
  public:
    // The name is not copied.
    Gate(Thread* thread, const char* name) : _name(name), _thread(thread) {}

    const char* name() const { return _name; }
    // The object; null once it is gone.
    Thread* thread() const { return _thread.load(std::memory_order_acquire); }

    // Lets the waiting thread run its main(). A failed assertion when it is open already.
    void open();
    // The object is going. A thread that has not passed the gate yet is sent home, even when the
    // gate was opened.
    void abandon();
    // Waits; the object whose main() is to be run, null for a thread that was sent home.
    Thread* pass();

    // One lock for all gates: they are used once a thread.
    static Mutex& readyToRunLock();

  private:
    const char* const _name;
    std::atomic<Thread*> _thread;
    bool _ready_to_run KORVEX_GUARDED_BY(readyToRunLock()) = false;
    ConditionWakeAll _ready_to_run_cond;
};

}  // namespace korvex
