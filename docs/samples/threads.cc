// Two workers that count under one lock, and work handed to the main thread.
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <cstdio>

static Logger logger("threads");

static Mutex mutex;
static ConditionWakeAll changed;
static int count = 0;  // guarded by mutex

class Counter : public Thread {
  public:
    explicit Counter(const char* name) : Thread(name) {}
    void main() override {
        for (int i = 0; i < 1000; ++i) {
            const ScopedMutex lock(mutex);
            ++count;
            changed.wake_all();
        }
    }
};

class Greeting : public InThreadActor {
  public:
    void callback() override { std::printf("hello from %s\n", Thread::currentName()); }
};

class Guest : public Thread {
  public:
    explicit Guest(InThreadActorQueue& queue) : Thread("guest"), _queue(queue) {}
    void main() override {
        Greeting greeting;
        greeting.callback();             // runs here
        _queue.submitAndWait(greeting);  // runs on the thread that owns the queue
    }

  private:
    InThreadActorQueue& _queue;
};

int main() {
    Thread mainThread;  // once, before any other
    Counter a("a"), b("b");
    a.go();
    b.go();
    {
        ScopedMutex lock(mutex);
        while (count < 2000)
            changed.wait(lock);
        std::printf("counted to %d\n", count);
    }
    a.join();
    b.join();

    InThreadActorQueue queue;
    Guest guest(queue);
    guest.go();
    while (queue.runQueued() == 0)
        queue.waitForWork(60);
    guest.join();

    try {
        PthreadObject::checkPtRes("pthread_example", 11);
    } catch (const PthreadException& e) {
        std::printf("caught: %s\n", e.what());
    }
}
