#pragma once

#include <korvex/Export.h>
#include <korvex/util/ThreadObj.h>

#include <cstddef>
#include <memory>

KORVEX_NAMESPACE(korvex) {

class KORVEX_HIDDEN ActiveThreads;

// A piece of work that another thread runs. It is submitted through an InThreadActorQueue.
class InThreadActor {
  public:
    InThreadActor() = default;
    InThreadActor(const InThreadActor&) = delete;
    InThreadActor& operator=(const InThreadActor&) = delete;
    virtual ~InThreadActor() noexcept(false);

    // The work. It runs on the thread that owns the queue.
    virtual void callback() = 0;

  private:
    friend class InThreadActorQueue;

    bool _wantWake = false;          // the submitter waits
    ConditionWakeAll _cond;          // what it waits on
    bool _ran = false;               // the work has run
    bool _queued = false;            // it waits on a queue
    InThreadActor* _next = nullptr;  // in the queue
};

// A queue of work for one thread, in the order of submission. Any thread may submit; the thread
// that owns the queue runs the work. The queue does not own its actors. An actor can be queued only
// once at a time: to submit it again before it has begun to run is a failed assertion.
class InThreadActorQueue {
  public:
    InThreadActorQueue() = default;
    InThreadActorQueue(const InThreadActorQueue&) = delete;
    InThreadActorQueue& operator=(const InThreadActorQueue&) = delete;

    // Queues the actor and returns at once. The actor must live until it has run. It may delete
    // itself in callback().
    void submit(InThreadActor& actor);
    // Queues the actor and returns when it has run (or its callback has thrown). The actor must
    // outlive the call, so it must not delete itself. The owner of the queue must not call this: it
    // would wait for ever.
    void submitAndWait(InThreadActor& actor);

    // For the owner: runs the actors that are queued at the call, in order, and returns how many it
    // ran. Actors that are added by callbacks meanwhile stay for the next call. If a callback
    // throws, the exception leaves this function and the rest stays queued.
    std::size_t runQueued();
    // For the owner: waits for work, at most timeoutSecs seconds. Returns whether there is any.
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
// The constructor starts the operating-system thread, with a stack of 1 MiB. That thread waits for
// go(), so main() never sees an object that is not fully constructed. An exception that leaves
// main() ends the process (std::terminate). The same thread must call join() and the destructor.
//
// After fork(2) the child has none of the parent's threads: it must not join or destroy their
// objects. It may build Threads of its own.
//
// After mainThreadDying() this object may be destroyed while its operating-system thread still
// runs. The thread keeps its name, and current() is null there. But nothing protects the members of
// the object. So after go(), destroy it only if the thread was joined, or if main() has begun and
// does not touch the object any more.
//
// If the constructor of a derived class throws, nobody can join the thread, and the assertion in
// the destructor ends the process. So do in main() what may fail.
class Thread : public PthreadObject {
  public:
    // Joins a thread and then deletes its Thread object. A Thread that was made with new can end
    // its own life this way: it queues its helper for another thread, by submit(), not
    // submitAndWait().
    class JoinHelper : public InThreadActor {
      public:
        // `thr` may be null.
        explicit JoinHelper(Thread* thr) : _thr(thr) {}
        // Does nothing if there is no thread.
        void callback() override;

      private:
        Thread* const _thr;
    };

    // The object of the main thread. Throws PthreadException "Main Thread created twice!". If the
    // stack size cannot be set, logs a warning on the channel "Thread"; threads then get the
    // platform's default.
    Thread();
    // A worker. The name is not copied and must outlive it. Throws PthreadException "Thread
    // created before main thread!", and when the thread cannot be created (checked).
    explicit Thread(const char* thrname);
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;
    // A failed assertion if the thread was not joined, unless mainThreadDying() was called. In that
    // case a thread that has not begun to run main() ends without running it, even after go().
    virtual ~Thread() noexcept(false);

    // The body of the thread. Not called for the object of the main thread.
    virtual void main();

    // Lets the thread run main(). A second call is a failed assertion.
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
    // The join helper of this thread, owned by this object.
    JoinHelper& joinHelper() { return _jhelp; }

    // The object of the calling thread. Null on the main thread, on threads not made by this class,
    // and after the object was destroyed. Takes no lock.
    static Thread* current();
    // The name of the calling thread, also after its object was destroyed. "Main Thread" on the
    // main thread and on threads not made by this class. Takes no lock.
    static const char* currentName();

    // For the end of the process. From now on failures of the thread library are ignored, and
    // threads need not be joined. Cannot be undone.
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
    bool _created = false;  // whether there is a thread to join
    bool _did_join;
    // Shared with the operating-system thread, which may wait there when this object is destroyed.
    std::shared_ptr<Gate> _gate;
    JoinHelper _jhelp;
};

}  // KORVEX_NAMESPACE(korvex)
