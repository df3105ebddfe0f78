#pragma once

#include <korvex/util/Thread.h>

#include <atomic>
#include <memory>

inline namespace korvex {

// What a Thread object and its operating-system thread share. It exists until both have ended. From
// it the thread gets its name, learns whether its object still exists, and waits in it for go().
class KORVEX_HIDDEN Thread::Gate : public std::enable_shared_from_this<Thread::Gate> {
  public:
    // The name is not copied.
    Gate(Thread* thread, const char* name) : _name(name), _thread(thread) {}

    const char* name() const { return _name; }
    // The object; null once it is gone.
    Thread* thread() const { return _thread.load(std::memory_order_acquire); }

    // Lets the waiting thread run main(). A failed assertion if it is already open.
    void open();
    // Says that the object is being destroyed. A thread that has not passed the gate yet ends
    // without running main(), even if the gate was opened.
    void abandon();
    // Waits. Returns the object whose main() is to be run, or null if the thread must end without
    // it.
    Thread* pass();

    // One lock for all gates: each thread uses its gate only once.
    static Mutex& readyToRunLock();

  private:
    const char* const _name;
    std::atomic<Thread*> _thread;
    bool _ready_to_run KORVEX_GUARDED_BY(readyToRunLock()) = false;
    ConditionWakeAll _ready_to_run_cond;
};

}  // namespace korvex
