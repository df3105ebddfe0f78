#include "explorer/Races.h"

#include <algorithm>

#include "explorer/Scheduler.h"

namespace schedules {

namespace {

struct Clock {
    std::uint32_t of[kMaxThreads];

    void add(const Clock& other) {
        for (unsigned i = 0; i < kMaxThreads; ++i)
            of[i] = std::max(of[i], other.of[i]);
    }
};

Clock threadClock[kMaxThreads];
bool started = false;  // a thread; before that there is nothing to find

// What was released at an object.
struct Published {
    const void* object;
    Clock clock;
};
constexpr unsigned kPublished = 4096;
Published published[kPublished];

Clock* publishedAt(const void* object) {
    std::size_t at = reinterpret_cast<std::size_t>(object) >> 2;
    for (unsigned tried = 0; tried < kPublished; ++tried, ++at) {
        Published& entry = published[at % kPublished];
        if (entry.object == nullptr) entry.object = object;
        if (entry.object == object) return &entry.clock;
    }
    return nullptr;
}

// The last accesses to eight bytes: one bit a byte, and the time by the thread's own clock.
struct Access {
    std::uint32_t time;
    std::uint32_t caller;  // of a program that is not linked to lie anywhere, so 32 bits do
    std::uint8_t bytes;
};
struct Cell {
    std::uintptr_t word;  // the address / 8
    Access write[kMaxThreads];
    Access read[kMaxThreads];
};
constexpr unsigned kCells = 32768;
Cell cells[kCells];

// Neighbours lie side by side, so that they take few of the run's pages.
Cell* cellOf(std::uintptr_t word, bool make) {
    for (unsigned tried = 0; tried < 64; ++tried) {
        Cell& cell = cells[(word + tried) % kCells];
        if (cell.word == word) return &cell;
        if (cell.word != 0) continue;
        if (!make) return nullptr;
        cell.word = word;
        return &cell;
    }
    return nullptr;
}

unsigned self() {
    return Scheduler::instance().self().number;
}

// Fails when another thread's access to these bytes is not known to have happened before.
void expectBefore(const Access (&accesses)[kMaxThreads], std::uint8_t bytes, const char* what,
                  const char* earlier, const void* caller) {
    const unsigned me = self();
    for (unsigned other = 0; other < kMaxThreads; ++other) {
        const Access& access = accesses[other];
        if (other == me || (access.bytes & bytes) == 0) continue;
        if (access.time <= threadClock[me].of[other]) continue;
        Scheduler::instance().failAt(
            caller, reinterpret_cast<const void*>(static_cast<std::uintptr_t>(access.caller)),
            "data race: thread %u %s what thread %u %s", me, what, other, earlier);
    }
}

void accessWord(Cell& cell, std::uint8_t bytes, bool writes, const void* caller) {
    const unsigned me = self();
    expectBefore(cell.write, bytes, writes ? "writes" : "reads", "has written", caller);
    if (writes) expectBefore(cell.read, bytes, "writes", "has read", caller);
    Access& access = writes ? cell.write[me] : cell.read[me];
    const std::uint32_t time = threadClock[me].of[me];
    const auto known = access.time == time ? access.bytes : std::uint8_t{0};
    access = {time, static_cast<std::uint32_t>(reinterpret_cast<std::uintptr_t>(caller)),
              static_cast<std::uint8_t>(known | bytes)};
}

bool active() {
    return started && Scheduler::instance().running();
}

}  // namespace

void Races::beginThread(unsigned created, unsigned creator) {
    started = true;
    threadClock[created] = threadClock[creator];
    threadClock[created].of[created] = 1;
    ++threadClock[creator].of[creator];
}

void Races::joinThread(unsigned joined) {
    threadClock[self()].add(threadClock[joined]);
}

void Races::acquire(const void* object) {
    if (!active()) return;
    if (const Clock* const clock = publishedAt(object)) threadClock[self()].add(*clock);
}

void Races::release(const void* object) {
    if (!active()) return;
    const unsigned me = self();
    if (Clock* const clock = publishedAt(object)) *clock = threadClock[me];
    ++threadClock[me].of[me];
}

void Races::releaseMore(const void* object) {
    if (!active()) return;
    const unsigned me = self();
    if (Clock* const clock = publishedAt(object)) clock->add(threadClock[me]);
    ++threadClock[me].of[me];
}

void Races::forget(const void* object) {
    if (!active()) return;
    if (Clock* const clock = publishedAt(object)) *clock = Clock();
}

void Races::access(const void* address, std::size_t size, bool writes, const void* caller) {
    if (!active()) return;
    auto at = reinterpret_cast<std::uintptr_t>(address);
    const std::uintptr_t end = at + size;
    while (at < end) {
        const std::uintptr_t word = at / 8;
        const std::uintptr_t stop = std::min(end, (word + 1) * 8);
        const unsigned bytes = ((1U << (stop - at)) - 1) << (at % 8);
        if (Cell* const cell = cellOf(word, true))
            accessWord(*cell, static_cast<std::uint8_t>(bytes), writes, caller);
        at = stop;
    }
}

void Races::freed(const void* address, std::size_t size, const void* caller) {
    if (!active()) return;
    const std::uintptr_t first = reinterpret_cast<std::uintptr_t>(address) / 8;
    for (std::uintptr_t word = first; word < first + std::min<std::size_t>(size, 4096) / 8;
         ++word) {
        Cell* const cell = cellOf(word, false);
        if (cell == nullptr) continue;
        expectBefore(cell->write, 0xff, "frees", "has written", caller);
        expectBefore(cell->read, 0xff, "frees", "has read", caller);
    }
}

}  // namespace schedules
