#include "explorer/Scheduler.h"

#include <unistd.h>

#include <algorithm>
#include <cstdarg>
#include <cstdio>

#include "explorer/SharedObjects.h"

extern "C" int __real_vsnprintf(char*, size_t, const char*, va_list);

namespace schedules {

namespace {

thread_local ThreadState* selfState = nullptr;

SharedObjects objects;

constexpr std::size_t kMostLookedAt = 1024;  // bytes of memory that is freed

Scheduler theScheduler;  // built by the compiler, so that static initialisers may announce points

bool isReady(const Operation& operation) {
    return operation.ready == nullptr || operation.ready(operation.argument);
}

}  // namespace

Scheduler& Scheduler::instance() {
    return theScheduler;
}

ThreadState& Scheduler::self() {
    return *selfState;
}

void Scheduler::begin(Board& board, Strategy& strategy) {
    _board = &board;
    _strategy = &strategy;
    selfState = add();
    selfState->handle = pthread_self();
}

ThreadState* Scheduler::add() {
    for (ThreadState& thread : _threads) {
        if (thread.life != ThreadState::UNUSED) continue;
        thread.life = ThreadState::ALIVE;
        thread.number = static_cast<unsigned>(&thread - _threads);
        thread.next = {"start", &thread};
        sem_init(&thread.baton, 0, 0);
        return &thread;
    }
    return nullptr;
}

ThreadState* Scheduler::find(pthread_t handle) {
    for (ThreadState& thread : _threads) {
        const bool known = thread.life == ThreadState::ALIVE || thread.life == ThreadState::ENDED;
        if (known && !thread.joined && pthread_equal(thread.handle, handle) != 0) return &thread;
    }
    return nullptr;
}

bool Scheduler::alone() const {
    return std::count_if(_threads, _threads + kMaxThreads, [](const ThreadState& thread) {
               return thread.life == ThreadState::ALIVE;
           }) == 1;
}

Turn Scheduler::point(const Operation& operation) {
    if (!running()) return Turn::READY;
    ThreadState& self = *selfState;
    self.next = operation;
    note(self);
    const bool matters = operation.object == nullptr || isShared(operation.object);
    const unsigned chosen = choose(self, matters);
    if (chosen != self.number) handOver(self, _threads[chosen]);
    return self.turn;
}

void Scheduler::note(const ThreadState& self) {
    if (_board->steps == kMaxSteps - 2) fail("no end after %u operations", _board->steps);
    const Operation& next = self.next;
    write({next.what, next.object, next.caller, static_cast<std::uint8_t>(self.number),
           _forkedChild});
    if (next.object == nullptr || (alone() && !_forkedChild)) return;
    if (objects.use(next.object, self.number, next.access == Operation::CHANGES))
        tellShared(next.object);
}

void Scheduler::write(const Step& step) {
    _board->step[_board->steps++] = step;
}

void Scheduler::freed(const void* memory, std::size_t size) {
    if (alone() && !_forkedChild) return;
    const char* const p = static_cast<const char*>(memory);
    for (std::size_t at = 0; at < std::min(size, kMostLookedAt); at += 4) {
        if (objects.giveUp(p + at, selfState->number)) tellShared(p + at);
    }
}

void Scheduler::tellShared(const void* object) {
    if (isShared(object) || _board->sharedObjects == kMaxShared) return;
    _board->shared[_board->sharedObjects++] = object;
}

bool Scheduler::isShared(const void* object) const {
    const void* const* const begin = _board->shared;
    const void* const* const end = begin + _board->sharedObjects;
    return std::find(begin, end, object) != end;
}

unsigned Scheduler::choose(ThreadState& self, bool matters) {
    Choice choice{_board->steps - 1, self.number, false, matters, 0, 0, 0};
    const auto add = [](ThreadMask& mask, unsigned number) {
        mask = static_cast<ThreadMask>(mask | bit(number));
    };
    for (const ThreadState& thread : _threads) {
        if (thread.life != ThreadState::ALIVE) continue;
        if (isReady(thread.next)) {
            add(choice.ready, thread.number);
        } else {
            if (thread.next.patience == Operation::MAY_TIME_OUT)
                add(choice.couldTimeOut, thread.number);
            if (thread.next.mayWake) add(choice.couldWake, thread.number);
        }
    }
    choice.currentCouldGoOn = (choice.ready & bit(self.number)) != 0;
    if ((choice.ready | choice.couldTimeOut) == 0) failForDeadlock();
    unsigned chosen = self.number;
    if (choice.ready != bit(self.number) || choice.couldTimeOut != 0 || choice.couldWake != 0)
        chosen = _strategy->choose(choice);
    ThreadState& next = _threads[chosen];
    next.turn = (choice.ready & bit(chosen)) != 0          ? Turn::READY
                : (choice.couldTimeOut & bit(chosen)) != 0 ? Turn::TIMED_OUT
                                                           : Turn::WOKEN;
    const bool matteredAtAll = !choice.currentCouldGoOn || matters;
    if (matteredAtAll && !_forkedChild) {
        _board->decision[_board->decisions++] = {choice.step,
                                                 static_cast<std::uint8_t>(self.number),
                                                 choice.currentCouldGoOn,
                                                 static_cast<std::uint8_t>(chosen),
                                                 choice.ready,
                                                 choice.couldTimeOut,
                                                 choice.couldWake};
    }
    return chosen;
}

void Scheduler::handOver(ThreadState& from, ThreadState& to) {
    ++_turns;
    sem_post(&to.baton);
    while (sem_wait(&from.baton) != 0) {
    }
}

void Scheduler::beginThread(ThreadState& self) {
    selfState = &self;
    while (sem_wait(&self.baton) != 0) {
    }
}

void Scheduler::endThread() {
    ThreadState& self = *selfState;
    point({"end", &self});
    self.life = ThreadState::ENDED;
    self.next = {"ended", &self};
    note(self);
    ThreadState& next = _threads[choose(self, true)];
    ++_turns;
    sem_post(&next.baton);
}

void Scheduler::becomeForkedChild() {
    _forkedChild = true;
    for (ThreadState& thread : _threads) {
        if (thread.life == ThreadState::ALIVE && &thread != selfState)
            thread.life = ThreadState::GONE;
    }
}

void Scheduler::failForDeadlock() {
    char text[800];
    int used = 0;
    for (const ThreadState& thread : _threads) {
        if (thread.life == ThreadState::UNUSED || thread.life == ThreadState::ENDED) continue;
        used += std::snprintf(text + used, sizeof text - static_cast<std::size_t>(used),
                              thread.life == ThreadState::GONE
                                  ? "; thread %u, which the fork left behind, was at %s"
                                  : "; thread %u waits to %s",
                              thread.number, thread.next.what);
    }
    fail("nobody can go on%s%s", _forkedChild ? " in the child of a fork" : "", text);
}

void Scheduler::fail(const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    endFailed(fmt, ap);
}

void Scheduler::failAt(const void* caller, const void* otherCaller, const char* fmt, ...) {
    const auto number = static_cast<std::uint8_t>(selfState->number);
    write({"the other one", nullptr, otherCaller, number, _forkedChild});
    write({"this one", nullptr, caller, number, _forkedChild});
    va_list ap;
    va_start(ap, fmt);
    endFailed(fmt, ap);
}

void Scheduler::endFailed(const char* fmt, va_list ap) {
    if (_board != nullptr && !_board->failed) {
        _board->failed = true;
        __real_vsnprintf(_board->failure, sizeof _board->failure, fmt, ap);
    }
    _exit(kFailed);
}

}  // namespace schedules
