#include <korvex/util/Thread.h>

#include "base/Assert.h"
#include "platform/CondTimedWait.h"

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
    KORVEX_ASSERT(!actor._queued);
    actor._queued = true;
    actor._ran = false;
    actor._next = nullptr;
    *_lastp = &actor;
    _lastp = &actor._next;
    ++_queued;
    _submitted.wake_all();
}

std::size_t InThreadActorQueue::runQueued() {
    const std::size_t atTheCall = queued();
    for (std::size_t count = 0; count < atTheCall; ++count) {
        InThreadActor* const actor = takeFirst();
        if (actor == nullptr) return count;  // another thread runs the queue too
        // An actor that nobody waits for may delete itself in its callback. So it is not used
        // afterwards.
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
    }
    return atTheCall;
}

std::size_t InThreadActorQueue::queued() {
    const ScopedMutex lock(_mutex);
    return _queued;
}

bool InThreadActorQueue::waitForWork(unsigned int timeoutSecs) {
    ScopedMutex lock(_mutex);
    // One deadline for all waits: a spurious wake-up does not start the time again.
    const Deadline deadline(timeoutSecs);
    while (_first == nullptr && _submitted.waitUntil(_mutex, deadline)) {
    }
    return _first != nullptr;
}

InThreadActor* InThreadActorQueue::takeFirst() {
    const ScopedMutex lock(_mutex);
    InThreadActor* const actor = _first;
    if (actor == nullptr) return nullptr;
    _first = actor->_next;
    if (_first == nullptr) _lastp = &_first;
    --_queued;
    actor->_queued = false;
    return actor;
}

void InThreadActorQueue::markRan(InThreadActor& actor) {
    const ScopedMutex lock(_mutex);
    actor._ran = true;
    actor._cond.wake_all();
}

}  // namespace korvex
