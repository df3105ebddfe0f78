#pragma once

#include <korvex/util/ThreadSafety.h>

#include <pthread.h>

#include <atomic>

inline namespace korvex {

// Lets any number of writers in together, and shuts them out for whoever needs the file to itself.
//
// One word holds how many are inside and whether the gate is shut. What keeps it right:
// - Nobody comes in while it is shut, and who is turned away has changed nothing.
// - shut() returns when nobody is inside. From then on until open(), other threads only read the
//   word. So a child that is forked meanwhile finds it as if its other threads had never been.
// - Who leaves while it is shut does so under _mutex, and shut() waits under it: so that mutex,
// too,
//   is free and nobody's when shut() has returned.
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

    // Waits, asleep, until nobody is inside. For one thread at a time, which is not inside; no harm
    // when it is shut already.
    void shut() noexcept KORVEX_ACQUIRE();
    // By the thread that shut it, or its copy in the child of a fork.
    void open() noexcept KORVEX_RELEASE() { _word.store(0, std::memory_order_release); }

    // Is inside for a scope, if the gate lets it in.
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
