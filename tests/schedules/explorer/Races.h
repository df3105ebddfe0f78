#pragma once

#include <cstddef>
#include <cstdint>

namespace schedules {

// Finds plain accesses to the same bytes by two threads, one of them a write, with nothing between
// them that orders the two: neither a lock, nor an atomic store that is released and a load of it
// that is acquired, nor a thread's creation or end. Such a race is found whichever came first, so
// it takes no preemption just there; and a memory order that is too weak is found on a machine that
// makes nothing of it. (Vector clocks, after Flanagan and Freund's FastTrack, PLDI 2009.)
class Races {
  public:
    static void beginThread(unsigned created, unsigned creator);
    static void joinThread(unsigned joined);

    // What other threads have released there has happened before what the calling one does next.
    static void acquire(const void* object);
    // Nothing but this thread's past is to be had there from now on.
    static void release(const void* object);
    // This thread's past is to be had there too.
    static void releaseMore(const void* object);
    // Nobody's past is to be had there any more.
    static void forget(const void* object);

    static void access(const void* address, std::size_t size, bool writes, const void* caller);
    // The memory is given up: a write to what of it has been used.
    static void freed(const void* address, std::size_t size, const void* caller);
};

}  // namespace schedules
