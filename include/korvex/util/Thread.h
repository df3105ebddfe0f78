#pragma once

#include <korvex/Export.h>
#include <korvex/util/ThreadObj.h>

#include <cstddef>
#include <memory>

KORVEX_NAMESPACE(korvex) {

// A piece of work that is handed to another thread to run, through an InThreadActorQueue.
class InThreadActor {
  public:
    InThreadActor() = default;
    InThreadActor(const InThreadActor&) = delete;
    InThreadActor& operator=(const InThreadActor&) = delete;
    virtual ~InThreadActor() noexcept(false);

    // The work; runs on the thread that owns the queue.
    virtual void callback() = 0;

  private:
    friend class InThreadActorQueue;

    bool _wantWake = false;          // the submitter waits
    ConditionWakeAll _cond;          // where it waits
    bool _ran = false;               // the work has run
    bool _queued = false;            // it waits on a queue
    InThreadActor* _next = nullptr;  // in the queue
};

// Work for one thread, in the order in which it was submitted. Any thread may submit; the thread
// that owns the queue runs it. Actors are not owned and are on one queue at a time, once: a second
// submission before the actor has begun to run is a failed assertion.
class InThreadActorQueue {
  public:
    InThreadActorQueue() = default;
    InThreadActorQueue(const InThreadActorQueue&) = delete;
    InThreadActorQueue& operator=(const InThreadActorQueue&) = delete;

    // Leaves the actor for the owner and returns at once. The actor must live until it has run,
    // and may delete itself in callback().
    void submit(InThreadActor& actor);
    // Returns once the actor has run (or its callback has thrown). The actor must outlive the
    // call, so it must not delete itself; the owner itself would wait for ever.
    void submitAndWait(InThreadActor& actor);

    // For the owner: runs what is queued at the call, in order, and tells how many actors that
    // were. What callbacks add meanwhile, themselves perhaps, stays for the next call. An exception
    // of a callback comes through; the rest stays queued.
    std::size_t runQueued();
    // For the owner: waits until there is work, at most timeoutSecs seconds; whether there is.
    bool waitForWork(unsigned int timeoutSecs);

  private:
    void append(InThreadActor& actor) KORVEX_REQUIRES(_mutex);
    InThreadActor* takeFirst();
    std::size_t queued();
    void markRan(InThreadActor& actor);

    Mutex _mutex;  // guards the list and the actors' bookkeeping
    ConditionWakeAll _submitted;
    InThreadActor* _first KORVEX_GUARDED_BY(_mutex) = nullptr;
    InThreadActor** _lastp KORVEX_GUARDED_BY(_mutex) = &_first;
    std::size_t _queued KORVEX_GUARDED_BY(_mutex) = 0;
};

// A thread. Derive, implement main(), build the object, call go(), and join() it exactly once:
//
//     Thread mainThread;                       // once, before any other
//     class Worker : public Thread { void main() override {...} } worker;   // Thread("worker")
//     worker.go();
//     worker.join();
//
// The operating-system thread starts in the constructor, with a stack of 1 MiB, and waits at a gate
// until go(), so that main() never meets a half-built object. An exception that leaves main() ends
// the process (std::terminate). join() and the destructor belong to one thread.
//
// After fork(2) the child has none of the parent's threads: it must not join or destroy their
// objects. It may build Threads of its own.
//
// After mainThreadDying() this object may be destroyed while its operating-system thread still
// runs: the thread keeps its name and finds current() null. But nothing can guard the object's own
// members: once go() was called, either main() is known to have begun, and touches the object no
// more, or the thread is joined.
//
// A derived class whose constructor throws leaves a thread that nobody can join: the destructor's
// assertion ends the process. Do in main() what may fail.
class Thread : public PthreadObject {
  public:
    // Joins and then deletes its thread. Queue it on another thread (submit(), never
    // submitAndWait()) and a thread made with new can have itself cleared away.
    class JoinHelper : public InThreadActor {
      public:
        // A null thread is none.
        explicit JoinHelper(Thread* thr) : _thr(thr) {}
        // Nothing when there is no thread.
        void callback() override;

      private:
        Thread* const _thr;
    };

    // The main thread's object. Throws PthreadException "Main Thread created twice!". A stack size
    // that cannot be set is a warning on the channel "Thread"; threads then get the platform's.
    Thread();
    // A worker. The name is not copied and must outlive it. Throws PthreadException "Thread
    // created before main thread!", and when the thread cannot be created (checked).
    explicit Thread(const char* thrname);
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;
    // A failed assertion when the thread was not joined, unless mainThreadDying() was called; then
    // a thread that is still at its gate ends without running main(), opened or not.
    virtual ~Thread() noexcept(false);

    // The body of the thread. Not called for the main thread's object.
    virtual void main();

    // Opens the gate. A second call is a failed assertion.
    void go();
    // Waits until the thread has ended (pthread_join(3), checked). A second call is a failed
    // assertion.
    void join();

    // The thread's name.
    const char* name() const { return _name; }
    // Whether the calling thread is this one.
    bool isCurrent() const;
    // Whether both are the same thread.
    bool operator==(const Thread& other) const;
    // This thread's join helper; belongs to the thread.
    JoinHelper& joinHelper() { return _jhelp; }

    // The calling thread's object; null on the main thread, on threads not made by this class, and
    // once the object is gone. Takes no lock.
    static Thread* current();
    // The calling thread's name, even when its object is gone; "Main Thread" on the main thread and
    // on threads not made by this class. Takes no lock.
    static const char* currentName();

    // For the end of the process: from now on failures of the thread library are ignored and
    // threads need not be joined. Cannot be taken back.
    static void mainThreadDying();

  private:
    friend class ActiveThreads;

    class Gate;
    struct Start;

    static void* callMain(void* arg);
    void start();

    static const std::size_t s_stackSize;  // bytes

    PthreadToken _token;
    const char* const _name;
    bool _created = false;  // there is a thread to join
    bool _did_join;
    // Shared with the operating-system thread, which may be waiting there when this object goes.
    std::shared_ptr<Gate> _gate;
    JoinHelper _jhelp;
};

}  // KORVEX_NAMESPACE(korvex)
