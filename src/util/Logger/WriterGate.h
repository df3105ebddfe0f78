#pragma once

#include <korvex/util/ThreadSafety.h>

#include <pthread.h>

#include <atomic>

inline namespace korvex {

// Lets any number of writers in together, and shuts them out if a thread needs the file alone.
//
// One word holds the number of writers inside, and whether the gate is shut. The rules:
// - While it is shut, no thread enters. A thread that is turned away has changed nothing.
// - shut() returns when no thread is inside. From then on until open(), other threads only read
//   the word. So a child that is forked meanwhile finds it as if it had no other threads.
// - A thread that leaves while it is shut does so under _mutex, and shut() waits under it. So that
//   mutex, too, is free when shut() has returned.
class KORVEX_CAPABILITY("gate") WriterGate {
  public:
    // Shut at first.
    WriterGate() = default;
    WriterGate(const WriterGate&) = delete;
    WriterGate& operator=(const WriterGate&) = delete;

    // False while it is shut.
    bool enter() noexcept KORVEX_TRY_ACQUIRE_SHARED(true) {
        unsigned word = _word.load(std::memory_order_relaxed);
        while ((word & kShut) == 0) {
            if (_word.compare_exchange_weak(word, word + 1, std::memory_order_acquire,
                                            std::memory_order_relaxed)) {
                return true;
            }
        }
        return false;
    }
    void leave() noexcept KORVEX_RELEASE_SHARED() {
        unsigned word = _word.load(std::memory_order_relaxed);
        while ((word & kShut) == 0) {
            if (_word.compare_exchange_weak(word, word - 1, std::memory_order_release,
                                            std::memory_order_relaxed)) {
                return;
            }
        }
        leaveShut();
    }

    // Shuts the gate, and sleeps until no thread is inside. For one thread at a time, which is not
    // inside. Does nothing if it is already shut.
    void shut() noexcept KORVEX_ACQUIRE();
    // Called by the thread that shut it, or by its copy in the child of a fork.
    void open() noexcept KORVEX_RELEASE() { _word.store(0, std::memory_order_release); }

    // Enters for a scope, if the gate is open.
    class Visit;

  private:
    static constexpr unsigned kShut = 1u << 31;  // the other bits count those inside

    void leaveShut() noexcept;

    std::atomic<unsigned> _word{kShut};
    pthread_mutex_t _mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_cond_t _empty = PTHREAD_COND_INITIALIZER;
};

class WriterGate::Visit {
  public:
    explicit Visit(WriterGate& gate) noexcept : _gate(gate), _inside(gate.enter()) {}
    Visit(const Visit&) = delete;
    Visit& operator=(const Visit&) = delete;
    ~Visit() { leave(); }

    bool inside() const { return _inside; }
    void leave() noexcept KORVEX_NO_THREAD_SAFETY_ANALYSIS {
        if (_inside) _gate.leave();
        _inside = false;
    }

  private:
    WriterGate& _gate;
    bool _inside;
};

}  // namespace korvex
