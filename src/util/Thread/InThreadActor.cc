#include <korvex/util/Thread.h>

inline namespace korvex {

InThreadActor::~InThreadActor() noexcept(false) = default;

void Thread::JoinHelper::callback() {
    if (_thr == nullptr) return;
    _thr->join();
    delete _thr;
}

void InThreadActorQueue::submit(InThreadActor& actor) {
    const ScopedMutex lock(_mutex);
    actor._wantWake = false;
    append(actor);
}

void InThreadActorQueue::submitAndWait(InThreadActor& actor) {
    ScopedMutex lock(_mutex);
    actor._wantWake = true;
    append(actor);
    while (!actor._ran)
        actor._cond.wait(lock);
}

void InThreadActorQueue::append(InThreadActor& actor) {
    actor._ran = false;
    actor._next = nullptr;
    *_lastp = &actor;
    _lastp = &actor._next;
    _submitted.wake_all();
}

std::size_t InThreadActorQueue::runQueued() {
    std::size_t count = 0;
    while (InThreadActor* const actor = takeFirst()) {
        // An actor nobody waits for may delete itself in its callback: not a look at it after that.
        if (!actor->_wantWake) {
            actor->callback();
        } else {
            const struct MarkRan {
                InThreadActorQueue& queue;
                InThreadActor& actor;
                ~MarkRan() { queue.markRan(actor); }
            } onEveryWayOut{*this, *actor};
            actor->callback();
        }
        ++count;
    }
    return count;
}

bool InThreadActorQueue::waitForWork(unsigned int timeoutSecs) {
    ScopedMutex lock(_mutex);
    while (_first == nullptr && _submitted.wait(lock, timeoutSecs)) {
    }
    return _first != nullptr;
}

InThreadActor* InThreadActorQueue::takeFirst() {
    const ScopedMutex lock(_mutex);
    InThreadActor* const actor = _first;
    if (actor == nullptr) return nullptr;
    _first = actor->_next;
    if (_first == nullptr) _lastp = &_first;
    return actor;
}

void InThreadActorQueue::markRan(InThreadActor& actor) {
    const ScopedMutex lock(_mutex);
    actor._ran = true;
    actor._cond.wake_all();
}

}  // namespace korvex
