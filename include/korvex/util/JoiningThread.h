#pragma once

#include <korvex/Export.h>
#include <korvex/util/Thread.h>

#include <utility>

KORVEX_NAMESPACE(korvex) {

// A thread made of a callable. It starts at once, and is joined when this object is destroyed:
//
//     Thread mainThread;                                 // once, before any other
//     JoiningThread worker("worker", [&] { count(); });  // runs
//     worker.join();                                     // or at the end of the scope
//
// As with Thread, an exception that leaves the callable ends the process. Only one thread may make
// the calls below. After fork(2) the child must not destroy the parent's objects.
template <class Body>
class JoiningThread {
  public:
    // The name is not copied and must outlive the thread. `body` is called without arguments, and
    // is kept until this object is destroyed. Throws what Thread's constructor throws, and what
    // moving `body` throws.
    JoiningThread(const char* name, Body body) : _worker(name, std::move(body)) { _worker.go(); }
    JoiningThread(const JoiningThread&) = delete;
    JoiningThread& operator=(const JoiningThread&) = delete;
    // Calls join() unless it was called before. Throws what Thread::join throws.
    ~JoiningThread() noexcept(false) {
        if (!_joined) join();
    }

    // Waits until the thread has ended. A second call is a failed assertion.
    void join() {
        _joined = true;
        _worker.join();
    }

    // The thread itself.
    const Thread& thread() const { return _worker; }

  private:
    class Worker : public Thread {
      public:
        Worker(const char* name, Body body) : Thread(name), _body(std::move(body)) {}
        void main() override { _body(); }

      private:
        Body _body;
    };

    Worker _worker;
    bool _joined = false;
};

}  // KORVEX_NAMESPACE(korvex)
