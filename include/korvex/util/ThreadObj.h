#pragma once

#include <korvex/Export.h>
#include <korvex/util/ThreadSafety.h>

#include <pthread.h>

#include <cstdint>
#include <stdexcept>

KORVEX_NAMESPACE(korvex) {

class KORVEX_HIDDEN Deadline;

// What a failed thread-library call becomes: what() names the thread, the call and the error.
class PthreadException : public std::runtime_error {
  public:
    // Copies the text.
    explicit PthreadException(const char* message) : std::runtime_error(message) {}
};

// Base of the wrappers of POSIX threads; carries the check of the calls' results.
class PthreadObject {
  public:
    // Nothing when rval is 0, or once Thread::mainThreadDying() has switched checking off.
    // Otherwise logs a warning on the channel "Thread" and throws PthreadException with the same
    // text: the current thread's name, `funcname` and the meaning of error number `rval`.
    static void checkPtRes(const char* funcname, int rval);
};

// The identity of a thread. A plain value.
class PthreadToken {
  public:
    // No thread's token yet.
    PthreadToken() = default;

    // The calling thread's.
    static PthreadToken self();

    // By pthread_equal(3).
    bool operator==(const PthreadToken& other) const;

  private:
    friend class Thread;

    pthread_t _token{};
};

// A plain, non-recursive lock with POSIX's default attributes: locking it twice from one thread
// deadlocks. Any thread may use it. "Checked" below: by PthreadObject::checkPtRes.
class KORVEX_CAPABILITY("mutex") Mutex : public PthreadObject {
  public:
    // Checked.
    Mutex();
    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;
    // Checked, so destroying a locked mutex throws.
    ~Mutex() noexcept(false);

    // Checked; a lock that fails is not held.
    void lock() KORVEX_ACQUIRE();
    void unlock() KORVEX_RELEASE();
    // Whether the lock was free and is now held. Any failure but "busy" is checked.
    bool tryLock() KORVEX_TRY_ACQUIRE(true);
    // The same by the standard's name, so that std::unique_lock and std::scoped_lock take a Mutex.
    bool try_lock() KORVEX_TRY_ACQUIRE(true) { return tryLock(); }

    // For code that must not log: unchecked. True when the lock is held.
    bool NOLOG_lock() KORVEX_TRY_ACQUIRE(true);
    // pthread_mutex_unlock(3)'s own result.
    int NOLOG_unlock() KORVEX_RELEASE();

  private:
    friend class ConditionBaseClass;

    pthread_mutex_t _pthread_mutex{};
};

// A lock that its owner may take again: as many unlocks as locks set it free.
class RecursiveMutex {
  public:
    RecursiveMutex() = default;
    RecursiveMutex(const RecursiveMutex&) = delete;
    RecursiveMutex& operator=(const RecursiveMutex&) = delete;
    // As Mutex's.
    ~RecursiveMutex() noexcept(false) = default;

    // All checked, as Mutex's are.
    void lock();
    bool tryLock();
    // Does not look at who calls; a failed assertion when nobody holds the lock.
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
    // Unlocks; a failure throws unless another exception is on its way.
    ~ScopedMutex() noexcept(false) KORVEX_RELEASE();

  private:
    friend class ConditionBaseClass;

    Mutex& _mutex;
    const int _exceptions;
};

// Lets go of a Mutex, which the caller holds, for a scope.
class KORVEX_SCOPED_CAPABILITY ScopedMutexUnlocker {
  public:
    // Unlocks; throws what Mutex::unlock throws.
    explicit ScopedMutexUnlocker(Mutex& mutex) KORVEX_RELEASE(mutex);
    ScopedMutexUnlocker(const ScopedMutexUnlocker&) = delete;
    ScopedMutexUnlocker& operator=(const ScopedMutexUnlocker&) = delete;
    // Locks again; a failure throws unless another exception is on its way.
    ~ScopedMutexUnlocker() noexcept(false) KORVEX_RELEASE();

  private:
    Mutex& _mutex;
    const int _exceptions;
};

// A condition variable; derived classes say who is woken. Wake-ups without cause happen: test the
// predicate again. Any thread may use it.
class ConditionBaseClass : public PthreadObject {
  public:
    // Checked.
    ConditionBaseClass();
    ConditionBaseClass(const ConditionBaseClass&) = delete;
    ConditionBaseClass& operator=(const ConditionBaseClass&) = delete;
    ~ConditionBaseClass() noexcept(false);

    // Waits, giving the mutex, which the caller holds, free meanwhile. Checked.
    void wait(Mutex& mutex) KORVEX_REQUIRES(mutex);
    // (The analysis does not know that a guard holds its mutex.)
    void wait(ScopedMutex& guard) KORVEX_NO_THREAD_SAFETY_ANALYSIS { wait(guard._mutex); }
    // The same for at most timeoutSecs seconds from now, by a clock that nobody sets where the
    // platform has one. True when woken, false when the time is over; other failures are checked,
    // under the name "pthread_cond_timedwait_relative_np" on every platform, and then false.
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
    // Wakes all who wait, whether or not the caller holds their mutex. Checked.
    void wake_all() { internal_wake_all(); }
};

// One untyped pointer a thread. Use ThreadSpecificPointer.
class TSP_Implementor : public PthreadObject {
  public:
    // `cleanup` is run on a thread's value when it is replaced, and on a value that is not null
    // when its thread ends; it must not be null where set() replaces values. Checked.
    explicit TSP_Implementor(void (*cleanup)(void*));
    TSP_Implementor(const TSP_Implementor&) = delete;
    TSP_Implementor& operator=(const TSP_Implementor&) = delete;
    // Values that other threads still have are not cleaned up. Checked.
    ~TSP_Implementor() noexcept(false);

    // This thread's value; null before set().
    void* get() const;
    // Stores a value, cleaning up the present one unless it is the same. Checked.
    void set(void* v);
    // Gives the value up to the caller without cleaning it up; null stays. Checked.
    void* release();

  private:
    void internal_set(void* v);

    pthread_key_t _key{};
    bool _created = false;
    void (*const _cleanup_fn)(void*);
};

// One pointer to a T a thread; owns what it points at.
template <class T>
class ThreadSpecificPointer {
  public:
    ThreadSpecificPointer() : _impl(&cleanup) {}

    // This thread's object; null before set().
    T* get() const { return static_cast<T*>(_impl.get()); }
    // Takes ownership of `v`; deletes the present object unless it is the same.
    void set(T* v) { _impl.set(v); }
    // Hands this thread's object over to the caller.
    T* release() { return static_cast<T*>(_impl.release()); }

  private:
    static void cleanup(void* v) { delete static_cast<T*>(v); }

    TSP_Implementor _impl;
};

}  // KORVEX_NAMESPACE(korvex)
