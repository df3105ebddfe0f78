#pragma once

#include <korvex/Export.h>
#include <korvex/util/Thread.h>

#include <functional>
#include <utility>

KORVEX_NAMESPACE(korvex) {

// A thread made of a callable. It runs at once, and is joined when this object goes:
//
//     Thread mainThread;                                 // once, before any other
//     JoiningThread worker("worker", [&] { count(); });  // runs
//     worker.join();                                     // or at the end of the scope
//
// As with Thread, an exception that leaves the callable ends the process, and the calls below
// belong to one thread. After fork(2) the child must not destroy the parent's objects.
class JoiningThread {
  public:
    // The name is not copied and must outlive the thread. `body` is kept until this object goes.
    // Throws what Thread's constructor throws, and std::bad_alloc.
    JoiningThread(const char* name, std::function<void()> body) : _worker(name, std::move(body)) {
        _worker.go();
    }
    JoiningThread(const JoiningThread&) = delete;
    JoiningThread& operator=(const JoiningThread&) = delete;
    // Waits for the end of the thread, if join() has not. Throws what Thread::join throws.
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
        Worker(const char* name, std::function<void()> body)
            : Thread(name), _body(std::move(body)) {}
        void main() override { _body(); }

      private:
        const std::function<void()> _body;
    };

    Worker _worker;
    bool _joined = false;
};

}  // KORVEX_NAMESPACE(korvex)
