#pragma once

#include <korvex/Export.h>
#include <korvex/util/ThreadSafety.h>

#include <pthread.h>

#include <cstdint>
#include <stdexcept>

KORVEX_NAMESPACE(korvex) {

class KORVEX_HIDDEN Deadline;

// Thrown when a call of the thread library fails. what() names the thread, the call and the error.
class PthreadException : public std::runtime_error {
  public:
    // Copies the text.
    explicit PthreadException(const char* message) : std::runtime_error(message) {}
};

// Base of the wrappers of POSIX threads. It has the check of the results of calls.
class PthreadObject {
  public:
    // Does nothing if rval is 0, or after Thread::mainThreadDying(), which switches checking off.
    // Otherwise logs a warning on the channel "Thread" and throws PthreadException with the same
    // text: the name of the current thread, `funcname`, and the meaning of error number `rval`.
    static void checkPtRes(const char* funcname, int rval);
};

// The identity of a thread. A plain value.
class PthreadToken {
  public:
    // The token of no thread.
    PthreadToken() = default;

    // The token of the calling thread.
    static PthreadToken self();

    // By pthread_equal(3).
    bool operator==(const PthreadToken& other) const;

  private:
    friend class Thread;

    pthread_t _token{};
};

// A plain, non-recursive lock with the default attributes of POSIX: to lock it twice from one
// thread is a deadlock. Any thread may use it. "Checked" below means by PthreadObject::checkPtRes.
class KORVEX_CAPABILITY("mutex") Mutex : public PthreadObject {
  public:
    // Checked.
    Mutex();
    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;
    // Checked, so destroying a locked mutex throws.
    ~Mutex() noexcept(false);

    // Checked. If lock() fails, the lock is not held.
    void lock() KORVEX_ACQUIRE();
    void unlock() KORVEX_RELEASE();
    // Whether the lock was free and is now held. Any failure except "busy" is checked.
    bool tryLock() KORVEX_TRY_ACQUIRE(true);
    // The same by its name in the standard, so that std::unique_lock and std::scoped_lock accept a
    // Mutex.
    bool try_lock() KORVEX_TRY_ACQUIRE(true) { return tryLock(); }

    // For code that must not log: unchecked. True when the lock is held.
    bool NOLOG_lock() KORVEX_TRY_ACQUIRE(true);
    // Returns the result of pthread_mutex_unlock(3).
    int NOLOG_unlock() KORVEX_RELEASE();

  private:
    friend class ConditionBaseClass;

    pthread_mutex_t _pthread_mutex{};
};

// A lock that its owner may lock again. It is free after as many calls of unlock() as of lock().
class RecursiveMutex {
  public:
    RecursiveMutex() = default;
    RecursiveMutex(const RecursiveMutex&) = delete;
    RecursiveMutex& operator=(const RecursiveMutex&) = delete;
    // As in Mutex.
    ~RecursiveMutex() noexcept(false) = default;

    // Both checked, as in Mutex.
    void lock();
    bool tryLock();
    // Checked. Any thread may call it. A failed assertion if nobody holds the lock.
    void unlock();

  private:
    void claim();

    Mutex _mutex;        // the lock that is really held
    Mutex _owner_mutex;  // guards the rest; held briefly, never while blocking on _mutex
    PthreadToken _owner KORVEX_GUARDED_BY(_owner_mutex);
    bool _owner_valid KORVEX_GUARDED_BY(_owner_mutex) = false;
    std::uint32_t _owner_count KORVEX_GUARDED_BY(_owner_mutex) = 0;
};

// Holds a Mutex for a scope.
class KORVEX_SCOPED_CAPABILITY ScopedMutex {
  public:
    // Locks; throws what Mutex::lock throws.
    explicit ScopedMutex(Mutex& mutex) KORVEX_ACQUIRE(mutex);
    ScopedMutex(const ScopedMutex&) = delete;
    ScopedMutex& operator=(const ScopedMutex&) = delete;
    // Unlocks. A failure throws, except while another exception propagates.
    ~ScopedMutex() noexcept(false) KORVEX_RELEASE();

  private:
    friend class ConditionBaseClass;

    Mutex& _mutex;
    const int _exceptions;
};

// Unlocks a Mutex, which the caller holds, for a scope.
class KORVEX_SCOPED_CAPABILITY ScopedMutexUnlocker {
  public:
    // Unlocks; throws what Mutex::unlock throws.
    explicit ScopedMutexUnlocker(Mutex& mutex) KORVEX_RELEASE(mutex);
    ScopedMutexUnlocker(const ScopedMutexUnlocker&) = delete;
    ScopedMutexUnlocker& operator=(const ScopedMutexUnlocker&) = delete;
    // Locks again. A failure throws, except while another exception propagates.
    ~ScopedMutexUnlocker() noexcept(false) KORVEX_RELEASE();

  private:
    Mutex& _mutex;
    const int _exceptions;
};

// A condition variable. Derived classes decide who is woken. Spurious wake-ups happen, so test the
// predicate again. Any thread may use it.
class ConditionBaseClass : public PthreadObject {
  public:
    // Checked.
    ConditionBaseClass();
    ConditionBaseClass(const ConditionBaseClass&) = delete;
    ConditionBaseClass& operator=(const ConditionBaseClass&) = delete;
    ~ConditionBaseClass() noexcept(false);

    // Waits. The caller holds the mutex, which is unlocked while it waits. Checked.
    void wait(Mutex& mutex) KORVEX_REQUIRES(mutex);
    // (The analysis does not know that a guard holds its mutex.)
    void wait(ScopedMutex& guard) KORVEX_NO_THREAD_SAFETY_ANALYSIS { wait(guard._mutex); }
    // The same for at most timeoutSecs seconds from now, by a monotonic clock if the platform has
    // one. True if woken, false if the time is over. Other failures are checked, on every platform
    // under the name "pthread_cond_timedwait_relative_np"; where that does not throw, the result is
    // false.
    bool wait(Mutex& mutex, unsigned int timeoutSecs) KORVEX_REQUIRES(mutex);
    bool wait(ScopedMutex& guard, unsigned int timeoutSecs) KORVEX_NO_THREAD_SAFETY_ANALYSIS {
        return wait(guard._mutex, timeoutSecs);
    }

  protected:
    // Wake one waiter, or all. Checked.
    void internal_wake_one();
    void internal_wake_all();

  private:
    friend class InThreadActorQueue;

    bool waitUntil(Mutex& mutex, const Deadline& deadline) KORVEX_REQUIRES(mutex);

    pthread_cond_t _pthread_cond{};
};

// A condition that wakes every waiter.
class ConditionWakeAll : public ConditionBaseClass {
  public:
    // Wakes all waiters, whether or not the caller holds their mutex. Checked.
    void wake_all() { internal_wake_all(); }
};

// One untyped pointer per thread. Use ThreadSpecificPointer instead.
class TSP_Implementor : public PthreadObject {
  public:
    // `cleanup` is called with the value of a thread when set() replaces it, and when the thread
    // ends and the value is not null. It must not be null if set() replaces values. Checked.
    explicit TSP_Implementor(void (*cleanup)(void*));
    TSP_Implementor(const TSP_Implementor&) = delete;
    TSP_Implementor& operator=(const TSP_Implementor&) = delete;
    // The values of other threads are not cleaned up. Checked.
    ~TSP_Implementor() noexcept(false);

    // This thread's value; null before set().
    void* get() const;
    // Stores a value. Cleans up the present one, unless both are the same. Checked.
    void set(void* v);
    // Returns the value without cleaning it up, and stores null. Checked.
    void* release();

  private:
    void internal_set(void* v);

    pthread_key_t _key{};
    bool _created = false;
    void (*const _cleanup_fn)(void*);
};

// One pointer to a T per thread. It owns what it points to.
template <class T>
class ThreadSpecificPointer {
  public:
    ThreadSpecificPointer() : _impl(&cleanup) {}

    // This thread's object; null before set().
    T* get() const { return static_cast<T*>(_impl.get()); }
    // Takes ownership of `v`. Deletes the present object, unless both are the same.
    void set(T* v) { _impl.set(v); }
    // Gives ownership of this thread's object to the caller.
    T* release() { return static_cast<T*>(_impl.release()); }

  private:
    static void cleanup(void* v) { delete static_cast<T*>(v); }

    TSP_Implementor _impl;
};

}  // KORVEX_NAMESPACE(korvex)
